#include "platform/asn1/AsnSyntax.h"

#include "platform/asn1/AsnDecoder.h"
#include "platform/asn1/AsnNotation.h"

#include <memory>
#include <new>
#include <typeinfo>

bool AsnSyntax::isEqual(AsnSyntax const& other) const
{
    return this == &other || (typeid(*this) == typeid(other) && hasSameValue(other));
}

XCode AsnSyntax::encode(AsnOctets& out, String& error) const
{
    try
    {
        AsnEncoder encoder(AsnNotation::NAME_OF(*this), error);
        return encodeAs(encoder, AsnTag()) ? encoder.finish(out) : XCode::REFUSED;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

XCode AsnSyntax::decode(unsigned char const* octets, std::size_t length, String& error)
{
    try
    {
        std::unique_ptr<AsnSyntax> const decoded(createNew());
        if (decoded == nullptr)
            return XCode::NO_ELEMENT;
        AsnDecoder decoder(octets, length, AsnNotation::NAME_OF(*this), error);
        if (!decoder.decodeWhole(*decoded))
            return XCode::FAILURE;
        take(*decoded);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

bool AsnSyntax::encodeAs(AsnEncoder& encoder, AsnTag tag) const
{
    std::size_t const before = encoder.getSize();
    if (!encodeContents(encoder))
        return false;
    encoder.prependHeader(tag.isNone() ? getTag() : tag, isConstructed(), encoder.getSize() - before);
    return true;
}

bool AsnSyntax::decodeAs(AsnDecoder& decoder, AsnElement const& element, bool)
{
    return decodeContents(decoder, element);
}
