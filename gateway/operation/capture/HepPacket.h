#pragma once

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>

struct sockaddr;

/// What a capture server is told of one message on the wire, in version 3 of the encapsulation protocol that these
/// servers speak (HEP3): chunks of a vendor, a type, a length and a value behind a head of six octets.
///
///     HepPacket packet{HepPacket::SIP, IPPROTO_UDP, from, to, std::chrono::system_clock::now(), text};
///     std::string const octets = packet.encode(2001, {});
struct HepPacket
{
    enum Protocol : unsigned char
    {
        SIP = 1,
        RTCP = 5 ///< its reports, as JSON
    };

    Protocol protocol;
    unsigned char transport; ///< the protocol number of the internet's: IPPROTO_UDP, IPPROTO_TCP
    sockaddr const& from;    ///< both of version 4 or both of version 6
    sockaddr const& to;
    std::chrono::system_clock::time_point time;
    std::string_view payload;
    std::string_view correlation = {}; ///< the Call-ID of the call that it is about, where the payload does not say it

    static constexpr std::size_t LONGEST = 65507; ///< octets of a datagram

    /// `agent`: who captures; `password`: what the server knows it by, empty for none. Empty: it would be longer than
    /// LONGEST. Throws std::bad_alloc.
    std::string encode(std::uint32_t agent, std::string_view password) const;
};
