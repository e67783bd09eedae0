#include "properties/CC_PropertyCodecNegotiating.h"

#include "platform/base/NameOf.h"

unsigned int CC_PropertyCodecNegotiating::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyCodecNegotiating::getValueString(String& out) const
{
    if (m_state == NEGOTIATED)
        return out.concatf("Negotiated ( %u )", m_negotiatedValue);
    static constexpr NamedValue<State> NAMES[] = {{NOT_CAPABLE, "Not Capable"}, {IDLE, "Idle"}, {REQUEST, "Request"}};
    return out += NAME_OF(NAMES, m_state);
}
