#include "media/rtp/RtcpReports.h"

namespace
{
constexpr long long SECOND = 1000000000; // ns

/// Time as reports bear it: of the monotonic clock, which never steps. The far side only gives it back, and nobody
/// compares it with the time of day.
unsigned long long NTP(long long now)
{
    auto const seconds = static_cast<unsigned long long>(now / SECOND);
    auto const rest = static_cast<unsigned long long>(now % SECOND);
    return seconds << 32 | (rest << 32) / SECOND;
}

/// 16 bits of seconds, 16 of their fraction.
std::uint32_t MIDDLE(unsigned long long time) { return static_cast<std::uint32_t>(time >> 16); }
} // namespace

long long RtcpReports::draw()
{
    m_seed = m_seed * 6364136223846793005u + 1442695040888963407u;
    return m_interval / 2 + static_cast<long long>((m_seed >> 33) % static_cast<unsigned long long>(m_interval + 1));
}

bool RtcpReports::isDue(long long now)
{
    if (m_next == 0)
        m_next = now + draw() / 2; // the first comes sooner
    if (now < m_next)
        return false;
    m_next = now + draw();
    return true;
}

RtcpPacket RtcpReports::make(RtpNumbering const& numbering, RtpReception& reception, MediaQuality const& counted,
                             bool isBye, long long now)
{
    RtcpPacket packet;
    packet.sender = numbering.getSource();
    packet.isBye = isBye;
    if (counted.sentPackets != m_sentBefore)
        packet.senderInfo =
            RtcpSenderInfo{NTP(now), numbering.getTimestamp(now), static_cast<std::uint32_t>(counted.sentPackets),
                           static_cast<std::uint32_t>(counted.sentOctets)};
    m_sentBefore = counted.sentPackets;
    if (reception.isActive())
    {
        std::uint32_t const delay = m_lastReport == 0 ? 0 : MIDDLE(NTP(now - m_lastReportCame));
        packet.report = RtcpReport{reception.getSource(),
                                   reception.takeFractionLost(),
                                   reception.getLost(),
                                   reception.getHighest(),
                                   reception.getJitter(),
                                   m_lastReport,
                                   delay};
    }
    return packet;
}

void RtcpReports::take(RtcpPacket const& packet, RtpReception& reception, unsigned int clockRate, MediaQuality& quality,
                       long long now)
{
    if (packet.senderInfo)
    {
        m_lastReport = MIDDLE(packet.senderInfo->time);
        m_lastReportCame = now;
    }
    if (packet.report)
        readReport(*packet.report, clockRate, quality, now);
    if (packet.isBye && packet.sender == reception.getSource())
        reception.end();
}

void RtcpReports::readReport(RtcpReport const& report, unsigned int clockRate, MediaQuality& quality,
                             long long now) const
{
    quality.farLostPackets = static_cast<unsigned int>(report.lost < 0 ? 0 : report.lost);
    quality.farJitter = static_cast<unsigned int>(report.jitter * 1000ULL / clockRate);
    if (report.lastReport == 0)
        return;
    std::uint32_t const trip = MIDDLE(NTP(now)) - report.lastReport - report.delay;
    // a far side that holds its delay for longer than it was has clocks that do not agree
    quality.roundTripTime = static_cast<std::int32_t>(trip) < 0 ? 0 : static_cast<unsigned int>((trip * 1000ULL) >> 16);
}
