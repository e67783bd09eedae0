#include "platform/asn1/AsnPrimitive.h"

#include "platform/asn1/AsnDecoder.h"

#include <new>

namespace
{
constexpr unsigned int FIRST_OCTET_PAST_IA5 = 0x80;
constexpr std::size_t MAX_INTEGER_OCTETS = 4;
constexpr AsnTag STRING_SEGMENT(AsnTag::UNIVERSAL, AsnTag::OCTET_STRING);
} // namespace

AsnSyntax* AsnPrimitive::clone() const { return new (std::nothrow) AsnPrimitive(*this); }

AsnSyntax* AsnPrimitive::createNew() const { return clone(); }

bool AsnPrimitive::decodeContents(AsnDecoder& decoder, AsnElement const& element)
{
    if (!decoder.expectPrimitive(element))
        return false;
    return element.begin == element.end || decoder.fail("NULL has no contents, octet %zu", element.begin);
}

bool AsnIA5StringWrapper::hasSameValue(AsnSyntax const& same) const
{
    return m_text == static_cast<AsnIA5StringWrapper const&>(same).m_text;
}

bool AsnIA5StringWrapper::encodeContents(AsnEncoder& encoder) const
{
    std::string_view const text = m_text.view();
    for (std::size_t i = text.size(); i-- != 0;)
    {
        unsigned char const octet = static_cast<unsigned char>(text[i]);
        if (octet >= FIRST_OCTET_PAST_IA5)
            return encoder.fail("%02X at position %zu is no IA5 character", static_cast<unsigned int>(octet), i);
        encoder.prepend(octet);
    }
    return true;
}

bool AsnIA5StringWrapper::decodeContents(AsnDecoder& decoder, AsnElement const& element)
{
    m_text.clear();
    return appendSegment(decoder, element);
}

bool AsnIA5StringWrapper::appendSegment(AsnDecoder& decoder, AsnElement const& element)
{
    if (!element.isConstructed)
    {
        for (std::size_t i = element.begin; i != element.end; ++i)
            if (decoder.getOctet(i) >= FIRST_OCTET_PAST_IA5)
                return decoder.fail("%02X is no IA5 character, octet %zu",
                                    static_cast<unsigned int>(decoder.getOctet(i)), i);
        // the octets are characters as they stand
        m_text += String(reinterpret_cast<char const*>(decoder.getOctets(element.begin)), element.end - element.begin);
        return true;
    }
    if (!decoder.open(element))
        return false;
    AsnElement segment;
    for (std::size_t position = element.begin; position != element.end; position = segment.next)
    {
        if (!decoder.readElement(position, element.end, segment))
            return false;
        if (segment.tag != STRING_SEGMENT)
            return decoder.failWithTag("has a segment that is no OCTET STRING but", segment);
        if (!appendSegment(decoder, segment))
            return false;
    }
    decoder.close();
    return true;
}

bool AsnIntegerPrimitive::hasSameValue(AsnSyntax const& same) const
{
    return m_number == static_cast<AsnIntegerPrimitive const&>(same).m_number;
}

bool AsnIntegerPrimitive::encodeContents(AsnEncoder& encoder) const
{
    // the shortest two's complement: as long as the sign could not be told from the octet written last, one more
    int rest = m_number;
    for (;;)
    {
        unsigned char const octet = static_cast<unsigned char>(rest & 0xff);
        encoder.prepend(octet);
        rest >>= 8;
        bool const isSignBitSet = (octet & 0x80) != 0;
        if ((rest == 0 && !isSignBitSet) || (rest == -1 && isSignBitSet))
            return true;
    }
}

bool AsnIntegerPrimitive::decodeContents(AsnDecoder& decoder, AsnElement const& element)
{
    if (!decoder.expectPrimitive(element))
        return false;
    if (element.begin == element.end)
        return decoder.fail("a number needs an octet, octet %zu", element.begin);
    bool const isNegative = (decoder.getOctet(element.begin) & 0x80) != 0;
    // octets that only repeat the sign are allowed, however many
    std::size_t position = element.begin;
    unsigned char const sign = isNegative ? 0xff : 0x00;
    while (position + 1 != element.end && decoder.getOctet(position) == sign)
        ++position;
    bool const isSignRepeated = ((decoder.getOctet(position) & 0x80) != 0) == isNegative;
    if (element.end - position > MAX_INTEGER_OCTETS ||
        (element.end - position == MAX_INTEGER_OCTETS && !isSignRepeated))
        return decoder.fail("the number does not fit 32 bits, octet %zu", element.begin);
    unsigned int number = isNegative ? ~0U : 0U;
    for (; position != element.end; ++position)
        number = number << 8 | decoder.getOctet(position);
    m_number = static_cast<int>(number);
    return true;
}
