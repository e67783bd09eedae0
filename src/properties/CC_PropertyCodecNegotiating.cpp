#include "properties/CC_PropertyCodecNegotiating.h"

#include "platform/base/NameOf.h"

CC_PropertyCodecNegotiating::TypeId CC_PropertyCodecNegotiating::s_typeId;

String& CC_PropertyCodecNegotiating::getValueString(String& out) const
{
    if (m_state == NEGOTIATED)
        return out.concatf("Negotiated ( %u )", m_negotiatedValue);
    static constexpr NamedValue<State> NAMES[] = {{NOT_CAPABLE, "Not Capable"}, {IDLE, "Idle"}, {REQUEST, "Request"}};
    return out += NAME_OF(NAMES, m_state);
}
