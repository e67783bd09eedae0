#include "isdn/endpoint/IsdnCallState.h"

using namespace IsdnCallState;

namespace
{
bool IS_OUTGOING(State state) { return state >= CALL_INITIATED && state <= CALL_DELIVERED; }
bool IS_INCOMING(State state) { return state >= CALL_PRESENT && state <= CALL_RECEIVED; }
bool IS_LIVE(State state) { return state >= CALL_INITIATED && state <= ACTIVE; }

/// From an earlier state to a later one of the same direction.
Step FORWARD(bool isRight, State state, State next)
{
    return isRight && state < next ? Step{next, GO_ON} : Step{state, IGNORE};
}

Step STEP_IN(State state, Event event)
{
    switch (event)
    {
    case SETUP_ACK_IN:
        return state == CALL_INITIATED ? Step{OVERLAP_SENDING, DIAL_ON} : Step{state, IGNORE};
    case PROCEEDING_IN:
        return FORWARD(IS_OUTGOING(state), state, OUTGOING_PROCEEDING);
    case PROGRESS_IN:
        return {state, IS_OUTGOING(state) ? GO_ON : IGNORE};
    case ALERTING_IN:
        return FORWARD(IS_OUTGOING(state), state, CALL_DELIVERED);
    case CONNECT_IN:
        return FORWARD(IS_OUTGOING(state), state, ACTIVE);
    case DIGITS_IN:
        return {state, state == OVERLAP_RECEIVING ? COLLECT : state == ACTIVE ? GO_ON : IGNORE};
    case DISCONNECT_IN:
        return IS_LIVE(state) || state == CLEARING ? Step{CLEARING, RELEASE} : Step{state, IGNORE};
    case SETUP_IN:
        return state == NULL_STATE ? Step{CALL_PRESENT, GO_ON} : Step{state, IGNORE};
    default:
        return state != OVER ? Step{OVER, GO_ON} : Step{state, IGNORE};
    }
}

Step STEP_OUT(State state, Event event)
{
    switch (event)
    {
    case SETUP_OUT:
        return state == NULL_STATE ? Step{CALL_INITIATED, GO_ON} : Step{state, IGNORE};
    case SETUP_ACK_OUT:
        return FORWARD(state == CALL_PRESENT, state, OVERLAP_RECEIVING);
    case PROCEEDING_OUT:
        return FORWARD(IS_INCOMING(state), state, INCOMING_PROCEEDING);
    case PROGRESS_OUT:
        return {state, IS_INCOMING(state) && state != CALL_PRESENT ? GO_ON : IGNORE};
    case ALERTING_OUT:
        return FORWARD(IS_INCOMING(state), state, CALL_RECEIVED);
    case CONNECT_OUT:
        return FORWARD(IS_INCOMING(state), state, ACTIVE);
    default:
        return IS_LIVE(state)        ? Step{CLEARING, DISCONNECT}
               : state == NULL_STATE ? Step{OVER, GO_ON}
                                     : Step{state, IGNORE};
    }
}
} // namespace

Step IsdnCallState::STEP(State state, Event event)
{
    bool const isIn = event <= RELEASED_IN || event == SETUP_IN;
    return isIn ? STEP_IN(state, event) : STEP_OUT(state, event);
}

char const* IsdnCallState::NAME(State state)
{
    static constexpr char const* NAMES[] = {
        "null",           "call initiated", "overlap sending",   "outgoing call proceeding",
        "call delivered", "call present",   "overlap receiving", "incoming call proceeding",
        "call received",  "active",         "clearing",          "over"};
    return NAMES[state];
}
