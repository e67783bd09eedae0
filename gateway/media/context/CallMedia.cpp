#include "media/context/CallMedia.h"

#include "adapters/CC_CallAdapter.h"
#include "calls/CC_CallLeg.h"
#include "media/context/MediaCore.h"
#include "media/file/CallRecording.h"

std::atomic<unsigned int> CallMedia::s_numberOfInstances{0};

CallMedia::CallMedia(MediaCore& core, unsigned long long number, unsigned int loop)
    : m_core(&core), m_number(number), m_loop(loop)
{
    ++s_numberOfInstances;
}

CallMedia::~CallMedia()
{
    --s_numberOfInstances;
    if (m_recording == nullptr)
        return;
    m_recording->end();
    m_core->post(*this, MediaOrder::Record{m_number, nullptr});
}

void CallMedia::record(std::shared_ptr<CallRecording> const& recording)
{
    m_recording = recording;
    m_core->post(*this, MediaOrder::Record{m_number, recording});
}

std::string CallMedia::getRecording() const { return m_recording != nullptr ? m_recording->getPath() : std::string(); }

CallMedia::Part CallMedia::PART_OF(CC_CallAdapter const& adapter)
{
    CC_CallLeg const* const own = adapter.getOwnCallLeg();
    CC_CallLeg const* const peer = adapter.getPeerCallLeg();
    return own != nullptr && peer != nullptr && own->getSerial() > peer->getSerial() ? Part::CALLED : Part::CALLER;
}

std::unique_ptr<LegMedia> CallMedia::addLeg(IpAddress const& local, MediaObserver& observer, Part part)
{
    return m_core->createLeg(*this, local, observer, part);
}

std::unique_ptr<LegMedia> CallMedia::addChannel(int channel, MediaObserver& observer, Part part)
{
    return m_core->createChannelLeg(*this, Descriptor(channel), observer, part);
}
