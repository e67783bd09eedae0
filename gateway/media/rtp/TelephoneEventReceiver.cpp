#include "media/rtp/TelephoneEventReceiver.h"

#include <algorithm>
#include <utility>

namespace
{
constexpr long long PATIENCE = 500000000; // ns; senders repeat an event every 50 ms while it lasts
}

std::optional<HeardDigit> TelephoneEventReceiver::take()
{
    if (std::exchange(m_isTold, true))
        return std::nullopt;
    char const digit = TelephoneEvent::DIGIT_OF(m_event);
    if (digit == '\0')
        return std::nullopt;
    return HeardDigit{digit, static_cast<unsigned int>(m_duration * 1000ULL / m_clockRate)};
}

std::optional<HeardDigit> TelephoneEventReceiver::receive(RtpHeader const& header, TelephoneEvent const& event,
                                                          unsigned int clockRate, long long now)
{
    std::optional<HeardDigit> heard;
    if (!m_hasBegun || header.timestamp != m_timestamp)
    {
        if (m_hasBegun && static_cast<std::int32_t>(header.timestamp - m_timestamp) < 0 && now - m_time < PATIENCE)
            return heard; // late, of a digit before
        heard = take();
        m_hasBegun = true;
        m_isTold = false;
        m_event = event.event;
        m_timestamp = header.timestamp;
        m_duration = 0;
    }
    m_clockRate = clockRate;
    m_time = now;
    m_duration = std::max<std::uint32_t>(m_duration, event.duration);
    if (event.isEnd && !heard)
        heard = take();
    return heard;
}

std::optional<HeardDigit> TelephoneEventReceiver::expire(long long now)
{
    return m_isTold || now - m_time < PATIENCE ? std::nullopt : take();
}
