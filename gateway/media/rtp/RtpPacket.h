#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

/// The fixed part of an RTP packet's header (RFC 3550, 5.1).
struct RtpHeader
{
    static constexpr std::size_t LENGTH = 12; ///< octets

    bool marker = false;
    unsigned char type = 0; ///< 0 to 127
    std::uint16_t sequence = 0;
    std::uint32_t timestamp = 0;
    std::uint32_t source = 0; ///< SSRC

    /// Writes LENGTH octets: version 2, without padding, extension and contributing sources.
    void write(unsigned char* out) const;
};

/// A received packet, checked: the header and where in it the payload is. It refers to the octets it was read from.
struct RtpPacket
{
    RtpHeader header;
    std::span<unsigned char> payload; ///< without contributing sources, extension and padding

    /// Whether the octets are RTP: version 2, long enough for all that the header announces, the padding no longer than
    /// what it pads. Leaves `*this` in any state unless so.
    bool read(std::span<unsigned char> octets);

    /// Whether what came to a port for both (RFC 5761, 4) is RTCP.
    static bool IS_RTCP(std::span<unsigned char const> octets)
    {
        return octets.size() >= 2 && octets[1] >= 192 && octets[1] <= 223;
    }
};

/// Numbers in network order. @{
inline std::uint16_t READ_16(unsigned char const* from) { return static_cast<std::uint16_t>(from[0] << 8 | from[1]); }
inline std::uint32_t READ_32(unsigned char const* from)
{
    return static_cast<std::uint32_t>(READ_16(from)) << 16 | READ_16(from + 2);
}
inline void WRITE_16(unsigned char* to, std::uint16_t value)
{
    to[0] = static_cast<unsigned char>(value >> 8);
    to[1] = static_cast<unsigned char>(value);
}
inline void WRITE_32(unsigned char* to, std::uint32_t value)
{
    WRITE_16(to, static_cast<std::uint16_t>(value >> 16));
    WRITE_16(to + 2, static_cast<std::uint16_t>(value));
}
/// @}
