#pragma once

#include "media/rtp/RtcpPacket.h"
#include "media/rtp/RtpPacket.h"
#include "media/rtp/RtpPorts.h"

#include <optional>
#include <vector>

/// A far side on the loopback, by hand: two sockets, and a stream that is numbered as it should be.
class FarEnd
{
public:
    /// What it received.
    struct Received
    {
        RtpHeader header;
        std::vector<unsigned char> payload;
        MediaAddress from;
    };

    /// `host`: "127.0.0.1" or "::1". Throws std::runtime_error without sockets.
    explicit FarEnd(std::string const& host = "127.0.0.1");

    MediaAddress const& getRtp() const { return m_ports.address; }
    MediaAddress getRtcp() const { return m_ports.getRtcp(); }

    /// To the gateway's port for it.
    void setPeer(MediaAddress const& rtp) { m_peer = rtp; }
    /// A packet of the stream; numbering goes on by one, the timestamp by `ticks`.
    void say(std::vector<unsigned char> const& payload, unsigned int ticks = 160);
    /// A packet as it is. @{
    void send(RtpHeader const& header, std::vector<unsigned char> const& payload);
    void sendRaw(std::vector<unsigned char> const& octets);
    void sendRtcp(RtcpPacket const& packet);
    void sendRtcpRaw(std::vector<unsigned char> const& octets);
    /// @}
    /// Whether something has come, waiting for at most so many milliseconds.
    bool isReadable(int milliseconds) const;
    /// What has come; nothing when nothing is there. @{
    std::optional<Received> hear();
    std::vector<Received> hearAll();
    std::optional<RtcpPacket> hearRtcp(std::uint32_t about = 0);
    /// @}

    RtpHeader next; ///< with which `say` goes on

private:
    std::vector<unsigned char> take(int descriptor, MediaAddress* from);

    RtpPorts m_ports;
    MediaAddress m_peer;
};
