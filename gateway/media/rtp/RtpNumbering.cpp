#include "media/rtp/RtpNumbering.h"

#include <algorithm>
#include <utility>

namespace
{
constexpr long long SECOND = 1000000000;           // ns
constexpr long long LONGEST_PAUSE = 3600 * SECOND; // after which the timestamp may be anywhere
constexpr long long PAUSE = 40000000;              // ns, by which a packet may be late in the same talk spurt

bool IS_AFTER(std::uint16_t left, std::uint16_t right) { return static_cast<std::int16_t>(left - right) > 0; }
bool IS_LATER(std::uint32_t left, std::uint32_t right) { return static_cast<std::int32_t>(left - right) > 0; }
} // namespace

std::uint32_t RtpNumbering::elapsed(unsigned int clockRate, long long now) const
{
    long long const time = std::clamp(now - m_time, 0LL, LONGEST_PAUSE);
    return static_cast<std::uint32_t>(time / 1000 * clockRate / 1000000);
}

void RtpNumbering::noteTime(std::uint32_t timestamp, long long now)
{
    m_timestamp = timestamp;
    m_time = now;
    m_hasSent = true;
}

void RtpNumbering::follow(RtpHeader const& in, unsigned int clockRate, unsigned long long from, long long now)
{
    m_from = from;
    m_fromSource = in.source;
    m_sequenceShift = static_cast<std::uint16_t>(m_next - in.sequence);
    // at least one unit, or the far side would take the new talk for a piece of the old
    std::uint32_t const step = m_hasSent ? std::max(elapsed(clockRate, now), 1u) : 0;
    m_timestampShift = m_timestamp + step - in.timestamp;
    m_clockRate = clockRate;
    m_isOwn = false;
}

RtpHeader RtpNumbering::relay(RtpHeader const& in, unsigned char type, unsigned int clockRate, unsigned long long from,
                              long long now)
{
    bool const isNew = m_from != from || m_fromSource != in.source || m_clockRate != clockRate;
    if (isNew)
        follow(in, clockRate, from, now);
    RtpHeader const out{in.marker || isNew, type, static_cast<std::uint16_t>(in.sequence + m_sequenceShift),
                        in.timestamp + m_timestampShift, m_source};
    if (isNew || IS_AFTER(static_cast<std::uint16_t>(out.sequence + 1), m_next))
        m_next = static_cast<std::uint16_t>(out.sequence + 1);
    if (isNew || IS_LATER(out.timestamp, m_timestamp))
        noteTime(out.timestamp, now);
    return out;
}

RtpHeader RtpNumbering::next(unsigned char type, std::uint32_t ticks, unsigned int clockRate, long long now)
{
    bool const goesOn = m_isOwn && m_clockRate == clockRate && now - m_time <= PAUSE + m_ticks * SECOND / clockRate;
    std::uint32_t const step = goesOn ? m_ticks : m_hasSent ? std::max(elapsed(clockRate, now), 1u) : 0;
    m_from = 0;
    m_isOwn = true;
    m_clockRate = clockRate;
    m_ticks = ticks;
    noteTime(m_timestamp + step, now);
    return {!goesOn, type, m_next++, m_timestamp, m_source};
}

std::uint32_t RtpNumbering::beginEvent(unsigned int clockRate, long long now)
{
    std::uint32_t const step = m_hasSent ? std::max(elapsed(clockRate, now), 1u) : 0;
    m_from = 0;
    m_isOwn = false;
    m_clockRate = clockRate;
    noteTime(m_timestamp + step, now);
    return m_timestamp;
}

RtpHeader RtpNumbering::event(unsigned char type, std::uint32_t timestamp, bool marker)
{
    return {marker, type, m_next++, timestamp, m_source};
}

std::uint32_t RtpNumbering::getTimestamp(long long now) const { return m_timestamp + elapsed(m_clockRate, now); }
