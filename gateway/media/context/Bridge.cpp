#include "media/context/Bridge.h"

#include "media/file/CallRecording.h"
#include "media/rtp/RtpTermination.h"

#include <algorithm>
#include <new>

Bridge::Bridge() = default;
Bridge::~Bridge() = default;

void Bridge::add(RtpTermination& leg)
{
    m_legs.push_back(&leg);
    openEar(leg);
    connect();
}

void Bridge::remove(RtpTermination& leg)
{
    leg.setPartner(nullptr);
    leg.closeVoice();
    leg.openEar(false);
    std::erase(m_legs, &leg);
    connect();
}

void Bridge::connect()
{
    bool const arePartners = m_legs.size() == 2;
    for (RtpTermination* const leg : m_legs)
        leg->setPartner(arePartners ? m_legs[leg == m_legs[0] ? 1 : 0] : nullptr);
    if (needsConference())
        return openConference();
    m_conference.reset();
    for (RtpTermination* const leg : m_legs)
        leg->closeVoice();
}

bool Bridge::needsConference() const
{
    return m_legs.size() > 2 ||
           std::any_of(m_legs.begin(), m_legs.end(), [](RtpTermination const* leg) { return !leg->isRelayable(); });
}

void Bridge::openConference()
try
{
    unsigned int const rate = Conference::RATE(m_legs);
    if (m_conference == nullptr || m_conference->getRate() != rate)
        m_conference = std::make_unique<Conference>(rate);
    for (RtpTermination* const leg : m_legs)
        leg->openVoice(rate, m_legs.size() > 2);
}
catch (std::bad_alloc const&)
{
    m_conference.reset(); // what cannot be relayed is not heard
}

void Bridge::setRecording(CallRecording* recording)
{
    m_recording = recording;
    for (RtpTermination* const leg : m_legs)
        openEar(*leg);
}

void Bridge::openEar(RtpTermination& leg) const
try
{
    leg.openEar(m_recording != nullptr);
}
catch (std::bad_alloc const&)
{
    // what it says is missing in the recording
}

/// Begins with the first word.
void Bridge::record()
{
    std::array<short, CallRecording::FRAME> caller{};
    std::array<short, CallRecording::FRAME> others{};
    std::array<short, CallRecording::FRAME> one;
    bool isHeard = m_recording->hasBegun();
    for (RtpTermination* const leg : m_legs)
    {
        if (!leg->overhear(one))
            continue;
        isHeard = true;
        std::array<short, CallRecording::FRAME>& channel = leg->isCaller() ? caller : others;
        std::transform(channel.begin(), channel.end(), one.begin(), channel.begin(),
                       [](int a, int b) { return static_cast<short>(std::clamp(a + b, -32768, 32767)); });
    }
    if (isHeard)
        m_recording->put(caller, others);
}

void Bridge::tick(long long now)
{
    if (m_recording != nullptr)
        record();
    if (m_conference != nullptr)
        m_conference->tick(m_legs, now);
    for (RtpTermination* const leg : m_legs)
    {
        if (leg->isClocked())
            leg->tick(now);
    }
}
