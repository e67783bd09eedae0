#include "FarEnd.h"

#include "media/rtp/DatagramAddress.h"

#include <poll.h>
#include <stdexcept>
#include <sys/socket.h>

namespace
{
RtpPortRange s_range(33000, 59999, 0);

void SEND(int descriptor, std::vector<unsigned char> const& octets, MediaAddress const& to)
{
    DatagramAddress const address(to);
    sendto(descriptor, octets.data(), octets.size(), 0, &address.any, address.length);
}
} // namespace

FarEnd::FarEnd(std::string const& host)
{
    if (!s_range.open(MediaAddress::OF(host, 1).host, m_ports).isOk())
        throw std::runtime_error("no ports on " + host);
    next.source = 0x10000u + m_ports.address.port;
    next.type = 8;         // A-law
    next.sequence = 65500; // passes the end soon
    next.timestamp = 0xfffffe00u;
}

void FarEnd::say(std::vector<unsigned char> const& payload, unsigned int ticks)
{
    send(next, payload);
    ++next.sequence;
    next.timestamp += ticks;
    next.marker = false;
}

void FarEnd::send(RtpHeader const& header, std::vector<unsigned char> const& payload)
{
    std::vector<unsigned char> octets(RtpHeader::LENGTH);
    header.write(octets.data());
    octets.insert(octets.end(), payload.begin(), payload.end());
    sendRaw(octets);
}

void FarEnd::sendRaw(std::vector<unsigned char> const& octets) { SEND(m_ports.rtp.get(), octets, m_peer); }

void FarEnd::sendRtcpRaw(std::vector<unsigned char> const& octets)
{
    SEND(m_ports.rtcp.get(), octets, {m_peer.host, static_cast<unsigned short>(m_peer.port + 1)});
}

void FarEnd::sendRtcp(RtcpPacket const& packet)
{
    std::array<unsigned char, RtcpPacket::LONGEST> octets;
    std::size_t const length = packet.write(octets, 1);
    sendRtcpRaw({octets.begin(), octets.begin() + static_cast<std::ptrdiff_t>(length)});
}

std::vector<unsigned char> FarEnd::take(int descriptor, MediaAddress* from)
{
    std::vector<unsigned char> octets(2048);
    DatagramAddress source;
    source.length = sizeof source.version6;
    ssize_t const length = recvfrom(descriptor, octets.data(), octets.size(), 0, &source.any, &source.length);
    octets.resize(length < 0 ? 0 : static_cast<std::size_t>(length));
    if (from != nullptr && length >= 0)
        *from = source.get();
    return octets;
}

bool FarEnd::isReadable(int milliseconds) const
{
    pollfd descriptor{m_ports.rtp.get(), POLLIN, 0};
    return poll(&descriptor, 1, milliseconds) > 0;
}

std::optional<FarEnd::Received> FarEnd::hear()
{
    Received received;
    std::vector<unsigned char> octets = take(m_ports.rtp.get(), &received.from);
    RtpPacket packet;
    if (!packet.read(octets))
        return std::nullopt;
    received.header = packet.header;
    received.payload.assign(packet.payload.begin(), packet.payload.end());
    return received;
}

std::vector<FarEnd::Received> FarEnd::hearAll()
{
    std::vector<Received> all;
    while (std::optional<Received> received = hear())
        all.push_back(std::move(*received));
    return all;
}

std::optional<RtcpPacket> FarEnd::hearRtcp(std::uint32_t about)
{
    std::vector<unsigned char> const octets = take(m_ports.rtcp.get(), nullptr);
    RtcpPacket packet;
    return packet.read(octets, about) ? std::optional(packet) : std::nullopt;
}
