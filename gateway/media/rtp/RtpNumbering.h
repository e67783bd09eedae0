#pragma once

#include "media/rtp/RtpPacket.h"

/// The source, sequence numbers and timestamps that a far side sees of us: one stream from the leg's beginning to its
/// end, whoever it hears through us meanwhile. A relayed stream is shifted, so that its gaps and its rhythm come
/// through; when another takes its place, or a tone of ours, numbering and time go on where they were.
///
///     RtpHeader const out = numbering.relay(in, 8, 8000, partner, now); // what another leg's far side sent
///     RtpHeader const own = numbering.next(8, 160, 8000, now);          // what we make ourselves
class RtpNumbering
{
public:
    /// Random numbers with which the stream begins. `source`: SSRC.
    RtpNumbering(std::uint32_t source, std::uint16_t sequence, std::uint32_t timestamp)
        : m_source(source), m_next(sequence), m_timestamp(timestamp)
    {
    }

    std::uint32_t getSource() const { return m_source; }

    /// The header under which a relayed packet goes out with the payload type `type`. `from`: the number of the leg it
    /// came from. The first of each stream has the marker. `clockRate`: Hz. `now`: nanoseconds.
    RtpHeader relay(RtpHeader const& in, unsigned char type, unsigned int clockRate, unsigned long long from,
                    long long now);
    /// A packet that would have been relayed was not: what is relayed next goes on without the gap.
    void interrupt() { m_from = 0; }
    /// The header of our own next packet of `ticks` timestamp units of sound. The timestamp goes on by what the packet
    /// before bore, or, after a pause or what others said, by the time that has passed; then it has the marker.
    RtpHeader next(unsigned char type, std::uint32_t ticks, unsigned int clockRate, long long now);
    /// The header of our next packet at a moment that it keeps (telephone events). @{
    std::uint32_t beginEvent(unsigned int clockRate, long long now);
    RtpHeader event(unsigned char type, std::uint32_t timestamp, bool marker);
    /// @}

    /// The timestamp of the moment `now`, for reports.
    std::uint32_t getTimestamp(long long now) const;
    bool hasSent() const { return m_hasSent; }

private:
    std::uint32_t elapsed(unsigned int clockRate, long long now) const;
    void follow(RtpHeader const& in, unsigned int clockRate, unsigned long long from, long long now);
    void noteTime(std::uint32_t timestamp, long long now);

    std::uint32_t m_source;
    std::uint16_t m_next;      // after the highest that went out
    std::uint32_t m_timestamp; // of the newest packet, and when it went out
    long long m_time = 0;
    std::uint32_t m_ticks = 0; // of our own newest packet
    unsigned int m_clockRate = 8000;
    bool m_hasSent = false;
    bool m_isOwn = false;          // the newest packet was ours
    unsigned long long m_from = 0; // the leg whose packets are relayed, 0: none, and its far side's source
    std::uint32_t m_fromSource = 0;
    std::uint16_t m_sequenceShift = 0;
    std::uint32_t m_timestampShift = 0;
};
