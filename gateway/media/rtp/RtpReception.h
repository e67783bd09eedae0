#pragma once

#include "media/rtp/RtpPacket.h"

#include <optional>

/// What is counted of a received stream: the extended sequence number, losses and jitter (RFC 3550, 6.4.1 and A.1, A.3,
/// A.8). A far side that begins a stream anew, with another source or far away in the numbering, loses nothing thereby.
///
///     reception.count(packet.header, 8000, now);
///     reception.getLost();
class RtpReception
{
public:
    /// A packet of the far side's came. `clockRate`: in Hz, of its timestamp; 0: the timestamp tells nothing of when it
    /// was sent (telephone events repeat theirs), so it counts for no jitter. `now`: nanoseconds.
    void count(RtpHeader const& header, unsigned int clockRate, long long now);
    /// The far side said that it ends (BYE): what comes next is another stream.
    void end();

    /// Whether a stream comes, and its source. @{
    bool isActive() const { return m_isActive; }
    std::uint32_t getSource() const { return m_source; }
    /// @}
    /// Of the present stream: the highest sequence number with the rounds it made.
    std::uint32_t getHighest() const { return m_highest; }
    /// Of the present stream, as reports have it: negative when more came than were sent (duplicates).
    int getLost() const;
    /// Of all streams that came, without duplicates; absent before anything came.
    std::optional<unsigned int> getTotalLost() const;
    /// 256ths of what was expected since the last call that did not come.
    unsigned char takeFractionLost();
    /// In units of the stream's timestamp.
    std::uint32_t getJitter() const { return static_cast<std::uint32_t>(m_jitter); }
    /// Milliseconds; absent before two packets came.
    std::optional<unsigned int> getJitterMilliseconds() const;

private:
    void begin(RtpHeader const& header);
    void countJitter(RtpHeader const& header, unsigned int clockRate, long long now);
    std::uint32_t getExpected() const { return m_highest - m_base + 1; }

    bool m_isActive = false;
    bool m_hasCome = false;
    bool m_hasTransit = false;
    bool m_hasJitter = false;
    std::uint32_t m_source = 0;
    std::uint32_t m_base = 0;
    std::uint32_t m_highest = 0;
    std::uint32_t m_received = 0;
    std::uint32_t m_badSequence = 0;
    std::uint32_t m_expectedBefore = 0;
    std::uint32_t m_receivedBefore = 0;
    unsigned int m_lostBefore = 0; // in streams that are over
    unsigned int m_clockRate = 0;
    std::uint32_t m_transit = 0;
    double m_jitter = 0;
};
