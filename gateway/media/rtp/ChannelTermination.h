#pragma once

#include "media/rtp/RtpTermination.h"

/// A leg whose far side is no RTP stream but a 64 kbit/s channel of a line: a descriptor that gives and takes blocks of
/// 4 octets of timestamp (in samples, the most significant first) and 160 octets of A-law, 20 ms.
///
/// Inside it is a termination like all others: what comes is A-law in packets, so that a partner who takes A-law is
/// relayed to bit by bit, and any other is transcoded for. What is sent is cut into whole blocks again. There are no
/// reports and nobody to learn an address from. A packet that comes late makes its block late: whoever plays the
/// channel keeps time.
class ChannelTermination final : public RtpTermination
{
public:
    static constexpr std::size_t BLOCK = 160; ///< octets of speech

    ChannelTermination(unsigned long long number, Descriptor&& channel, MediaOptions const& options, Seed const& seed);

    /// What such a leg is to be described with: A-law, both ways; or CLEARMODE, which no partner mistakes for speech.
    static MediaDescription DESCRIPTION(MG_Rtp::ECodec::Type codec = MG_Rtp::ECodec::PCMA);

    void receiveRtp(DatagramBatch& batch, long long now) override;

private:
    static constexpr std::size_t TIMESTAMP = 4; // octets

    void sendDatagram(std::span<unsigned char const> octets, DatagramBatch* batch) override;
    void sendReport(bool, long long) override {}

    std::uint16_t m_sequence = 0;
    std::uint32_t m_source;
    std::size_t m_pending = 0; // octets of m_block that are speech already
    std::array<unsigned char, TIMESTAMP + BLOCK> m_block{};
};
