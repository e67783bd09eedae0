#pragma once

#include "properties/CC_PropertyClass.h"

/// How far a call leg has come. Not settable by text.
///
///     leg.setProperty(CC_PropertyCallLegState(CC_PropertyId::STATE, CC_PropertyCallLegState::ALERTING));
class CC_EXPORT CC_PropertyCallLegState : public CC_PropertyClass<CC_PropertyCallLegState>
{
public:
    /// The numbers count upward with the leg's progress and are compared as such; states in which it is not active are
    /// negative.
    enum State : int
    {
        IDLE = -2,
        RELEASED = -1,
        DISCONNECTING = 0,
        TRYING = 1,
        ADDRESS_INCOMPLETE = 2,
        PROCEEDING = 3,
        ALERTING = 4,
        HELD = 5,
        CONNECTED = 6
    };

    static constexpr char const* TYPE_NAME = "Call-Leg-State";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< RELEASED
    CC_PropertyCallLegState(unsigned int id, State state) : CC_PropertyClass(id), m_state(state) {}

    /// Replaces `out` by STATE_NAME.
    String& getValueString(String& out) const override;

    /// Setting tells nobody: a leg takes its state by `CC_CallLeg::setProperty`. @{
    State getState() const { return m_state; }
    void setState(State state) { m_state = state; }
    /// @}
    bool hasSameValue(CC_PropertyCallLegState const& other) const { return m_state == other.m_state; }

    /// "ADDRESS-INCOMPLETE"; ERROR::INVALID for a number that is no state.
    static char const* STATE_NAME(State state);

private:
    State m_state = RELEASED;
};
