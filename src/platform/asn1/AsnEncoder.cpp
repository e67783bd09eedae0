#include "platform/asn1/AsnEncoder.h"

#include "platform/asn1/AsnWire.h"

#include <tuple>
#include <utility>

void AsnEncoder::prependHeader(AsnTag tag, bool isConstructed, std::size_t contentLength)
{
    prependLength(contentLength);
    prependIdentifier(tag, isConstructed);
}

void AsnEncoder::prependLength(std::size_t length)
{
    if (length <= AsnWire::MAX_SHORT_LENGTH)
        return prepend(static_cast<unsigned char>(length));
    unsigned char octets = 0;
    for (; length != 0; length >>= 8, ++octets)
        prepend(static_cast<unsigned char>(length & 0xff));
    prepend(static_cast<unsigned char>(AsnWire::LONG_LENGTH | octets));
}

void AsnEncoder::prependIdentifier(AsnTag tag, bool isConstructed)
{
    unsigned int const first = AsnWire::CLASS_BITS(tag.getFlags()) | (isConstructed ? AsnWire::CONSTRUCTED : 0U);
    unsigned int number = tag.getNumber();
    if (number < AsnWire::LONG_TAG)
        return prepend(static_cast<unsigned char>(first | number));
    unsigned int more = 0; // every octet but the last says that one follows
    for (; number != 0; number >>= 7, more = AsnWire::MORE)
        prepend(static_cast<unsigned char>((number & 0x7f) | more));
    prepend(static_cast<unsigned char>(first | AsnWire::LONG_TAG));
}

XCode AsnEncoder::finish(AsnOctets& out) const
{
    AsnOctets octets;
    XCode const result = octets.reserve(m_reversed.size());
    if (!result.isOk())
        return result;
    for (auto octet = m_reversed.rbegin(); octet != m_reversed.rend(); ++octet)
        std::ignore = octets.append(*octet); // there is room
    out = std::move(octets);
    return XCode::OK;
}
