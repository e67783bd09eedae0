#include "platform/asn1/ASN_CHOICE.h"

#include "platform/asn1/AsnDecoder.h"

void ASN_CHOICE::use(unsigned int index)
{
    if (index != m_selected)
        selectNothing();
    m_selected = index;
}

void ASN_CHOICE::selectNothing()
{
    if (hasSelection())
        getComponent(m_selected).reset();
    m_selected = NONE;
}

bool ASN_CHOICE::hasSameValue(AsnSyntax const& same) const
{
    auto const& other = static_cast<ASN_CHOICE const&>(same);
    return m_selected == other.m_selected &&
           (!hasSelection() || getComponent(m_selected).isEqual(other.getComponent(m_selected)));
}

bool ASN_CHOICE::encodeAs(AsnEncoder& encoder, AsnTag tag) const
{
    std::size_t const before = encoder.getSize();
    if (!encodeContents(encoder))
        return false;
    if (!tag.isNone()) // around the alternative: replacing its tag would lose which one it is
        encoder.prependHeader(tag, true, encoder.getSize() - before);
    return true;
}

bool ASN_CHOICE::encodeContents(AsnEncoder& encoder) const
{
    return hasSelection() ? encodeField(encoder, m_selected) : encoder.fail("no alternative is selected");
}

bool ASN_CHOICE::decodeAs(AsnDecoder& decoder, AsnElement const& element, bool isTagged)
{
    if (!isTagged)
        return decodeContents(decoder, element);
    if (!decoder.open(element))
        return false;
    AsnElement alternative;
    if (!decoder.readElement(element.begin, element.end, alternative) || !decodeContents(decoder, alternative))
        return false;
    if (alternative.next != element.end)
        return decoder.fail("holds more than one alternative, octet %zu", alternative.next);
    decoder.close();
    return true;
}

bool ASN_CHOICE::decodeContents(AsnDecoder& decoder, AsnElement const& element)
{
    unsigned int const index = alternativeWith(element.tag);
    if (index == NONE)
        return decoder.failWithTag("has no alternative", element);
    use(index);
    return decodeField(decoder, element, index);
}

unsigned int ASN_CHOICE::alternativeWith(AsnTag tag) const
{
    for (unsigned int i = 0; i < getNumberOfFields(); ++i)
        if (canFieldBeginWith(i, tag))
            return i;
    return NONE;
}
