#pragma once

#include "platform/asn1/AsnTag.h"

/// The bits of identifier and length octets (X.690), for encoder and decoder.
namespace AsnWire
{
/// Bits of the identifier octet, X.690 8.1.2. @{
inline constexpr unsigned int CONSTRUCTED = 0x20;
inline constexpr unsigned int LONG_TAG = 0x1f; ///< the number follows, seven bits to an octet
inline constexpr unsigned int MORE = 0x80;     ///< in an octet of such a number: another follows
/// @}

/// Values of the first length octet, X.690 8.1.3. @{
inline constexpr unsigned int MAX_SHORT_LENGTH = 0x7f;
inline constexpr unsigned int LONG_LENGTH = 0x80; ///< the low bits count the octets that hold the length
inline constexpr unsigned int INDEFINITE_LENGTH = 0x80;
inline constexpr unsigned int RESERVED_LENGTH = 0xff;
/// @}

/// The class bits of an identifier octet.
constexpr unsigned int CLASS_BITS(unsigned int flags)
{
    switch (flags)
    {
    case AsnTag::APPLICATION:
        return 0x40;
    case AsnTag::CONTEXT:
        return 0x80;
    case AsnTag::PRIVATE:
        return 0xc0;
    default:
        return 0;
    }
}

/// The class that an identifier octet's class bits stand for.
constexpr unsigned int FLAGS_OF(unsigned int identifier) { return AsnTag::UNIVERSAL << (identifier >> 6 & 3); }
} // namespace AsnWire
