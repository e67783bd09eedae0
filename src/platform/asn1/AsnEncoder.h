#pragma once

#include "platform/asn1/AsnTag.h"
#include "platform/asn1/AsnTrace.h"
#include "platform/base/TYVector.h"

#include <vector>

/// The octets of an encoded value.
using AsnOctets = TYVector<unsigned char>;

/// Writes DER from the end to the beginning: contents first, then their length, so that each octet is written once.
///
/// Made by AsnSyntax::encode; the types call it for their contents. Throws std::bad_alloc.
///
///     std::size_t const before = encoder.getSize();
///     encoder.prepend(0x05);
///     encoder.prependHeader(AsnTag(AsnTag::CONTEXT, 1), false, encoder.getSize() - before); // 81 01 05
class CC_EXPORT AsnEncoder : public AsnTrace
{
public:
    using AsnTrace::AsnTrace;

    /// Puts one octet before those that are there.
    void prepend(unsigned char octet) { m_reversed.push_back(octet); }
    /// Identifier and length octets before contents of that length.
    void prependHeader(AsnTag tag, bool isConstructed, std::size_t contentLength);
    /// Octets written so far.
    std::size_t getSize() const { return m_reversed.size(); }
    /// Puts all octets into `out` in their order on the wire; OK, or NO_ELEMENT when memory is out, `out` unchanged.
    XCode finish(AsnOctets& out) const;

private:
    void prependIdentifier(AsnTag tag, bool isConstructed);
    void prependLength(std::size_t length);

    std::vector<unsigned char> m_reversed;
};
