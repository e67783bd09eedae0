#include "platform/asn1/AsnDecoder.h"

#include "platform/asn1/AsnSyntax.h"
#include "platform/asn1/AsnWire.h"

namespace
{
// the end of contents of indefinite length: an element of universal tag 0, which no type has
constexpr AsnTag END_OF_CONTENTS(AsnTag::UNIVERSAL, 0);
} // namespace

bool AsnDecoder::decodeWhole(AsnSyntax& value)
{
    AsnElement element;
    if (!readElement(0, m_length, element))
        return false;
    if (!value.canBeginWith(element.tag))
        return failWithTag("cannot begin with", element);
    if (!value.decodeAs(*this, element, false))
        return false;
    if (element.next != m_length)
        return fail("is over, but the input goes on, octet %zu", element.next);
    return true;
}

bool AsnDecoder::readElement(std::size_t position, std::size_t end, AsnElement& element)
{
    Header header;
    if (!readHeader(position, end, header))
        return false;
    element = header.element;
    return !header.isIndefinite || findEndOfContents(end, element);
}

bool AsnDecoder::readHeader(std::size_t position, std::size_t end, Header& header)
{
    AsnElement& element = header.element;
    element.offset = position;
    if (!readTag(position, end, element))
        return false;
    std::size_t length = 0;
    std::size_t const offsetOfLength = position;
    if (!readLength(position, end, length, header.isIndefinite))
        return false;
    if (header.isIndefinite && !element.isConstructed)
        return fail("indefinite length of a primitive element, octet %zu", offsetOfLength);
    if (length > end - position)
        return fail("the length %zu runs past the end, octet %zu", length, offsetOfLength);
    element.begin = position;
    element.end = element.next = position + length;
    return true;
}

bool AsnDecoder::readTag(std::size_t& position, std::size_t end, AsnElement& element)
{
    if (position >= end)
        return fail("the input ends where an element should begin, octet %zu", position);
    unsigned int const first = m_octets[position++];
    element.isConstructed = (first & AsnWire::CONSTRUCTED) != 0;
    unsigned int number = first & AsnWire::LONG_TAG;
    if (number == AsnWire::LONG_TAG && !readLongTagNumber(position, end, number))
        return false;
    element.tag = AsnTag(AsnWire::FLAGS_OF(first), number);
    return true;
}

bool AsnDecoder::readLongTagNumber(std::size_t& position, std::size_t end, unsigned int& number)
{
    std::size_t const offset = position;
    unsigned int octet = AsnWire::MORE;
    for (number = 0; (octet & AsnWire::MORE) != 0; ++position)
    {
        if (position >= end)
            return fail("the input ends within a tag, octet %zu", position);
        octet = m_octets[position];
        if (position == offset && octet == AsnWire::MORE)
            return fail("the tag number begins with zeros, octet %zu", offset);
        if (number > AsnTag::MAX_NUMBER >> 7)
            return fail("the tag number is too large, octet %zu", position);
        number = number << 7 | (octet & 0x7f);
    }
    if (number < AsnWire::LONG_TAG) // a tag has one form only, unlike a length
        return fail("the tag number %u must stand in the first octet, octet %zu", number, offset);
    return true;
}

bool AsnDecoder::readLength(std::size_t& position, std::size_t end, std::size_t& length, bool& isIndefinite)
{
    if (position >= end)
        return fail("the input ends where a length should stand, octet %zu", position);
    std::size_t const offset = position;
    unsigned int const first = m_octets[position++];
    isIndefinite = first == AsnWire::INDEFINITE_LENGTH;
    length = isIndefinite ? 0 : first;
    if (first <= AsnWire::INDEFINITE_LENGTH)
        return true;
    if (first == AsnWire::RESERVED_LENGTH)
        return fail("the length octet FF is reserved, octet %zu", offset);
    std::size_t const count = first & AsnWire::MAX_SHORT_LENGTH;
    if (count > end - position)
        return fail("the input ends within a length, octet %zu", offset);
    length = 0;
    for (std::size_t i = 0; i < count; ++i)
    {
        if (length > m_length) // no later octet can make it fit again
            return fail("the length runs past the end, octet %zu", offset);
        length = length << 8 | m_octets[position++];
    }
    return true;
}

bool AsnDecoder::findEndOfContents(std::size_t end, AsnElement& element)
{
    // a walk without recursion, however deep the input nests
    std::size_t openElements = 1;
    std::size_t position = element.begin;
    for (;;)
    {
        if (position >= end)
            return fail("contents of indefinite length do not end, octet %zu", element.offset);
        Header inner;
        if (!readHeader(position, end, inner))
            return false;
        bool const isEnd = inner.element.tag == END_OF_CONTENTS;
        if (isEnd && (inner.element.isConstructed || inner.element.next != position + 2))
            return fail("a malformed end of contents, octet %zu", position);
        if (inner.isIndefinite)
            ++openElements;
        if (isEnd && --openElements == 0)
            break;
        position = inner.element.next;
    }
    element.end = position;
    element.next = position + 2;
    return true;
}

bool AsnDecoder::open(AsnElement const& element)
{
    if (!element.isConstructed)
        return fail("must be constructed, octet %zu", element.offset);
    if (m_depth == MAX_DEPTH)
        return fail("is nested deeper than %u levels, octet %zu", MAX_DEPTH, element.offset);
    ++m_depth;
    return true;
}

bool AsnDecoder::expectPrimitive(AsnElement const& element)
{
    return !element.isConstructed || fail("must be primitive, octet %zu", element.offset);
}

bool AsnDecoder::failWithTag(char const* reason, AsnElement const& element)
{
    char const* className = "";
    switch (element.tag.getFlags())
    {
    case AsnTag::UNIVERSAL:
        className = "UNIVERSAL ";
        break;
    case AsnTag::APPLICATION:
        className = "APPLICATION ";
        break;
    case AsnTag::PRIVATE:
        className = "PRIVATE ";
        break;
    default:
        break;
    }
    return fail("%s [%s%u], octet %zu", reason, className, element.tag.getNumber(), element.offset);
}
