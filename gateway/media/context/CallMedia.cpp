#include "media/context/CallMedia.h"

#include "media/context/MediaCore.h"

std::atomic<unsigned int> CallMedia::s_numberOfInstances{0};

CallMedia::CallMedia(MediaCore& core, unsigned long long number, unsigned int loop)
    : m_core(&core), m_number(number), m_loop(loop)
{
    ++s_numberOfInstances;
}

CallMedia::~CallMedia() { --s_numberOfInstances; }

std::unique_ptr<LegMedia> CallMedia::addLeg(IpAddress const& local, MediaObserver& observer)
{
    return m_core->createLeg(*this, local, observer);
}

std::unique_ptr<LegMedia> CallMedia::addChannel(int channel, MediaObserver& observer)
{
    return m_core->createChannelLeg(*this, Descriptor(channel), observer);
}
