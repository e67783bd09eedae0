#include "media/rtp/ChannelTermination.h"

#include <algorithm>
#include <sys/socket.h>

namespace
{
constexpr unsigned char PAYLOAD_TYPE = 8;  // of A-law (RFC 3551); nobody sees that of others
constexpr unsigned int MOST_BLOCKS = 32;   // taken with one wake
constexpr unsigned short DISCARD_PORT = 9; // of the address that stands for the channel
} // namespace

ChannelTermination::ChannelTermination(unsigned long long number, Descriptor&& channel, MediaOptions const& options,
                                       Seed const& seed)
    : RtpTermination(number, RtpPorts{std::move(channel), Descriptor(), MediaAddress()}, options, seed)
    , m_source(seed.source)
{
}

MediaDescription ChannelTermination::DESCRIPTION(MG_Rtp::ECodec::Type codec)
{
    MediaDescription description;
    description.rtp = MediaAddress::OF("127.0.0.1", DISCARD_PORT);
    description.formats.add({VoipCodec(codec, 20), {PAYLOAD_TYPE, PAYLOAD_TYPE}});
    return description;
}

void ChannelTermination::receiveRtp(DatagramBatch& batch, long long now)
{
    std::array<unsigned char, DatagramBatch::ROOM> octets; // a partner writes behind what is relayed
    unsigned char* const block = octets.data() + RtpHeader::LENGTH - TIMESTAMP;
    DatagramAddress const from(getDescription().rtp);
    for (unsigned int i = 0; i < MOST_BLOCKS; ++i)
    {
        ssize_t const length = recv(getRtp(), block, TIMESTAMP + BLOCK + 1, MSG_DONTWAIT);
        if (length == 0)
            cutOff();
        if (length <= 0)
            return;
        if (static_cast<std::size_t>(length) != TIMESTAMP + BLOCK)
            continue;
        std::uint32_t const timestamp = READ_32(block);
        RtpHeader{false, PAYLOAD_TYPE, m_sequence++, timestamp, m_source}.write(octets.data());
        takeRtp(std::span(octets).first(RtpHeader::LENGTH + BLOCK), from, batch, now);
        sendRelayed(batch, now);
    }
}

void ChannelTermination::sendDatagram(std::span<unsigned char const> octets, DatagramBatch*)
{
    std::uint32_t timestamp = READ_32(octets.data() + 4) - static_cast<std::uint32_t>(m_pending);
    for (std::span<unsigned char const> speech = octets.subspan(RtpHeader::LENGTH); !speech.empty();)
    {
        std::size_t const taken = std::min(BLOCK - m_pending, speech.size());
        std::copy_n(speech.begin(), taken, m_block.begin() + static_cast<std::ptrdiff_t>(TIMESTAMP + m_pending));
        speech = speech.subspan(taken);
        m_pending += taken;
        if (m_pending < BLOCK)
            return;
        WRITE_32(m_block.data(), timestamp);
        timestamp += BLOCK;
        send(getRtp(), m_block.data(), m_block.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
        m_pending = 0;
    }
}
