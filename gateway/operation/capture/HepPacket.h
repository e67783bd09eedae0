#pragma once

#include "host/Capture.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

/// What a capture server is told of one message on the wire, in version 3 of the encapsulation protocol that these
/// servers speak (HEP3): chunks of a vendor, a type, a length and a value behind a head of six octets.
namespace HepPacket
{
constexpr std::size_t LONGEST = 65507; ///< octets of a datagram

/// Replaces `octets`. `agent`: who captures; `password`: what the server knows it by, empty for none. Empty: it would
/// be longer than LONGEST. Throws std::bad_alloc.
void ENCODE(std::string& octets, CapturedMessage const& message, std::uint32_t agent, std::string_view password);
} // namespace HepPacket
