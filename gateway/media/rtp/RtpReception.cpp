#include "media/rtp/RtpReception.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace
{
// as RFC 3550, A.1 has them
constexpr std::uint32_t SEQUENCES = 1u << 16;
constexpr std::uint32_t MAX_DROPOUT = 3000;
constexpr std::uint32_t MAX_MISORDER = 100;
constexpr std::uint32_t NO_SEQUENCE = SEQUENCES + 1;

constexpr double JITTER_GAIN = 16;
} // namespace

void RtpReception::begin(RtpHeader const& header)
{
    if (m_hasCome)
        m_lostBefore = *getTotalLost();
    m_isActive = m_hasCome = true;
    m_hasTransit = false;
    m_source = header.source;
    m_base = m_highest = header.sequence;
    m_received = m_expectedBefore = m_receivedBefore = 0;
    m_badSequence = NO_SEQUENCE;
}

void RtpReception::count(RtpHeader const& header, unsigned int clockRate, long long now)
{
    if (!m_isActive || header.source != m_source)
        begin(header);
    std::uint32_t const ahead = static_cast<std::uint16_t>(header.sequence - static_cast<std::uint16_t>(m_highest));
    if (ahead < MAX_DROPOUT)
        m_highest += ahead;
    else if (ahead <= SEQUENCES - MAX_MISORDER)
    {
        // two in a row from far away: the far side has begun anew without saying so
        bool const isSecond = header.sequence == m_badSequence;
        m_badSequence = (header.sequence + 1u) % SEQUENCES;
        if (!isSecond)
            return;
        begin(header);
    }
    ++m_received;
    if (clockRate != 0)
        countJitter(header, clockRate, now);
}

void RtpReception::countJitter(RtpHeader const& header, unsigned int clockRate, long long now)
{
    if (clockRate != m_clockRate)
        m_hasTransit = false;
    m_clockRate = clockRate;
    // seconds and rest apart, or the product would pass 64 bits after some years
    auto const arrival =
        static_cast<std::uint32_t>(now / 1000000000 * clockRate + now % 1000000000 * clockRate / 1000000000);
    std::uint32_t const transit = arrival - header.timestamp;
    auto const difference = static_cast<std::int32_t>(transit - m_transit);
    m_transit = transit;
    if (!std::exchange(m_hasTransit, true))
        return;
    m_hasJitter = true;
    m_jitter += (std::abs(static_cast<double>(difference)) - m_jitter) / JITTER_GAIN;
}

void RtpReception::end() { m_isActive = false; }

int RtpReception::getLost() const { return static_cast<int>(getExpected() - m_received); }

std::optional<unsigned int> RtpReception::getTotalLost() const
{
    if (!m_hasCome)
        return std::nullopt;
    return m_lostBefore + static_cast<unsigned int>(std::max(getLost(), 0));
}

unsigned char RtpReception::takeFractionLost()
{
    std::uint32_t const expected = getExpected() - std::exchange(m_expectedBefore, getExpected());
    std::uint32_t const received = m_received - std::exchange(m_receivedBefore, m_received);
    if (expected == 0 || received >= expected)
        return 0;
    return static_cast<unsigned char>(
        std::min<std::uint64_t>((static_cast<std::uint64_t>(expected - received) << 8) / expected, 255));
}

std::optional<unsigned int> RtpReception::getJitterMilliseconds() const
{
    if (!m_hasJitter)
        return std::nullopt;
    return static_cast<unsigned int>(std::lround(m_jitter * 1000 / m_clockRate));
}
