#include "properties/CC_PropertyCallLegState.h"

#include "platform/base/NameOf.h"

CC_PropertyCallLegState::TypeId CC_PropertyCallLegState::s_typeId;

String& CC_PropertyCallLegState::getValueString(String& out) const { return out = STATE_NAME(m_state); }

char const* CC_PropertyCallLegState::STATE_NAME(State state)
{
    static constexpr NamedValue<State> NAMES[] = {
        {IDLE, "IDLE"},
        {RELEASED, "RELEASED"},
        {DISCONNECTING, "DISCONNECTING"},
        {TRYING, "TRYING"},
        {ADDRESS_INCOMPLETE, "ADDRESS-INCOMPLETE"},
        {PROCEEDING, "PROCEEDING"},
        {ALERTING, "ALERTING"},
        {HELD, "HELD"},
        {CONNECTED, "CONNECTED"},
    };
    return NAME_OF(NAMES, state);
}
