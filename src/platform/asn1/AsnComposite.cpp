#include "platform/asn1/AsnComposite.h"

#include "platform/asn1/AsnDecoder.h"
#include "platform/base/Assert.h"

unsigned int AsnComposite::indexOf(AsnSyntax const& component) const
{
    for (unsigned int i = 0; i < m_numberOfFields; ++i)
        if (&getComponent(i) == &component)
            return i;
    TY_ASSERT(false, "not a component of this value");
    return NONE;
}

bool AsnComposite::canFieldBeginWith(unsigned int index, AsnTag tag) const
{
    AsnTag const own = m_fields[index].tag;
    return own.isNone() ? getComponent(index).canBeginWith(tag) : own == tag;
}

bool AsnComposite::encodeField(AsnEncoder& encoder, unsigned int index) const
{
    AsnTrace::Step const step(encoder, m_fields[index].name);
    return getComponent(index).encodeAs(encoder, m_fields[index].tag);
}

bool AsnComposite::decodeField(AsnDecoder& decoder, AsnElement const& element, unsigned int index)
{
    AsnTrace::Step const step(decoder, m_fields[index].name);
    return getComponent(index).decodeAs(decoder, element, !m_fields[index].tag.isNone());
}
