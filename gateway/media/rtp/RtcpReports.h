#pragma once

#include "media/quality/MediaQuality.h"
#include "media/rtp/RtcpPacket.h"
#include "media/rtp/RtpNumbering.h"
#include "media/rtp/RtpReception.h"

/// One leg's side of RTCP: when to report, what, and what the far side's reports say.
///
///     if (reports.isDue(now))
///         length = reports.make(numbering, reception, quality, false, now).write(buffer, reports.getName());
///     ...
///     reports.take(packet, reception, 8000, quality, now);
class RtcpReports
{
public:
    /// `interval`: nanoseconds between two reports, of which each waits 0.5 to 1.5, so that streams that began together
    /// do not report together (RFC 3550, 6.3.1). `seed`: any number, another for each leg.
    RtcpReports(long long interval, unsigned long long seed) : m_interval(interval), m_name(seed), m_seed(seed) {}

    /// Whether it is time, counted from the first time it was asked.
    bool isDue(long long now);
    /// A report of what was received and, if anything was sent since the report before, of that. `isBye`: the last one.
    RtcpPacket make(RtpNumbering const& numbering, RtpReception& reception, MediaQuality const& counted, bool isBye,
                    long long now);
    /// From which the canonical name is made.
    unsigned long long getName() const { return m_name; }
    /// Takes in what came. `clockRate`: of what we send, in Hz.
    void take(RtcpPacket const& packet, RtpReception& reception, unsigned int clockRate, MediaQuality& quality,
              long long now);

private:
    void readReport(RtcpReport const& report, unsigned int clockRate, MediaQuality& quality, long long now) const;
    long long draw();

    long long m_interval;
    unsigned long long m_name; // the same in each report
    unsigned long long m_seed;
    long long m_next = 0; // 0: not begun
    unsigned long long m_sentBefore = 0;
    std::uint32_t m_lastReport = 0;
    long long m_lastReportCame = 0;
};
