#include "platform/asn1/AsnSequenceOf.h"

#include "platform/asn1/AsnDecoder.h"

bool AsnList::hasSameValue(AsnSyntax const& same) const
{
    auto const& other = static_cast<AsnList const&>(same);
    if (getSize() != other.getSize())
        return false;
    for (std::size_t i = 0; i < getSize(); ++i)
        if (!getElement(i).isEqual(other.getElement(i)))
            return false;
    return true;
}

bool AsnList::encodeContents(AsnEncoder& encoder) const
{
    for (std::size_t i = getSize(); i-- != 0;)
    {
        AsnTrace::Step const step(encoder, i);
        if (!getElement(i).encodeAs(encoder, AsnTag()))
            return false;
    }
    return true;
}

bool AsnList::decodeContents(AsnDecoder& decoder, AsnElement const& element)
{
    if (!decoder.open(element))
        return false;
    clearElements();
    AsnElement next;
    for (std::size_t position = element.begin; position != element.end; position = next.next)
    {
        AsnTrace::Step const step(decoder, getSize());
        if (!decoder.readElement(position, element.end, next))
            return false;
        AsnSyntax* const value = appendElement();
        if (value == nullptr)
            throw std::bad_alloc();
        if (!value->canBeginWith(next.tag))
            return decoder.failWithTag("cannot begin with", next);
        if (!value->decodeAs(decoder, next, false))
            return false;
    }
    decoder.close();
    return true;
}
