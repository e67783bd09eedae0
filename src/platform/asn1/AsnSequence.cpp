#include "platform/asn1/AsnSequence.h"

#include "platform/asn1/AsnDecoder.h"

bool AsnSequence::isUsed(unsigned int index) const
{
    return !getFields()[index].isOptional || (m_present & 1U << index) != 0;
}

void AsnSequence::setAbsent(AsnSyntax& component)
{
    m_present &= ~(1U << indexOf(component));
    component.reset();
}

bool AsnSequence::hasSameValue(AsnSyntax const& same) const
{
    auto const& other = static_cast<AsnSequence const&>(same);
    for (unsigned int i = 0; i < getNumberOfFields(); ++i)
    {
        if (isUsed(i) != other.isUsed(i))
            return false;
        if (isUsed(i) && !getComponent(i).isEqual(other.getComponent(i)))
            return false;
    }
    return true;
}

bool AsnSequence::encodeContents(AsnEncoder& encoder) const
{
    for (unsigned int i = getNumberOfFields(); i-- != 0;)
        if (isUsed(i) && !encodeField(encoder, i))
            return false;
    return true;
}

bool AsnSequence::decodeContents(AsnDecoder& decoder, AsnElement const& element)
{
    if (!decoder.open(element))
        return false;
    AsnElement next;
    std::size_t position = element.begin; // of `next`, which has been read unless the contents are over
    if (position != element.end && !decoder.readElement(position, element.end, next))
        return false;
    m_present = 0;
    for (unsigned int i = 0; i < getNumberOfFields(); ++i)
    {
        if (position == element.end || !canFieldBeginWith(i, next.tag))
        {
            if (getFields()[i].isOptional)
                continue;
            AsnTrace::Step const step(decoder, getFields()[i].name);
            return decoder.fail("is missing, octet %zu", position);
        }
        use(i);
        if (!decodeField(decoder, next, i))
            return false;
        position = next.next;
        if (position != element.end && !decoder.readElement(position, element.end, next))
            return false;
    }
    if (position != element.end)
        return decoder.failWithTag("has no place for", next);
    decoder.close();
    return true;
}
