#include "sip/dialog/SipDialogState.h"

namespace
{
using namespace SipDialogState;

constexpr char const* NAMES[] = {"none", "INVITE received", "answered", "INVITE sent", "cancelled",
                                 "up",   "BYE sent",        "over"};

Step ON_ANSWER(State state)
{
    switch (state)
    {
    case INVITE_SENT:
        return {UP, PROCEED};
    case CANCELLED:
        return {BYE_SENT, ACK_AND_BYE};
    case UP:
    case BYE_SENT:
        return {state, ACKNOWLEDGE};
    default:
        return {state, IGNORE};
    }
}

Step ON_BYE(State state)
{
    switch (state)
    {
    case INVITE_RECEIVED: // a caller may end its early dialog this way
        return {OVER, TERMINATE};
    case ANSWERED:
    case UP:
        return {OVER, PROCEED};
    case BYE_SENT: // both sides hang up at once: each gets its answer
    case OVER:
        return {state, PROCEED};
    default:
        return {state, REFUSE};
    }
}

Step ON_END(State state)
{
    switch (state)
    {
    case NONE:
        return {OVER, PROCEED};
    case INVITE_RECEIVED:
        return {OVER, REJECT};
    case ANSWERED:
        return {ANSWERED, BYE_AFTER_ACK};
    case INVITE_SENT:
        return {CANCELLED, SEND_CANCEL};
    case UP:
        return {BYE_SENT, SEND_BYE};
    default:
        return {state, IGNORE};
    }
}

Step ON_TIMEOUT(State state)
{
    if (state == CANCELLED)
        return {OVER, GIVE_UP};
    return {state, state == INVITE_SENT ? GIVE_UP : IGNORE};
}

/// For an event that means something in one state alone.
Step ONLY_IN(State expected, State state, Step step) { return state == expected ? step : Step{state, IGNORE}; }
} // namespace

SipDialogState::Step SipDialogState::STEP(State state, Event event)
{
    switch (event)
    {
    case INVITE_IN:
        return ONLY_IN(NONE, state, {INVITE_RECEIVED, PROCEED});
    case INVITE_OUT:
        return ONLY_IN(NONE, state, {INVITE_SENT, PROCEED});
    case ANSWER_OUT:
        return ONLY_IN(INVITE_RECEIVED, state, {ANSWERED, PROCEED});
    case ANSWER_IN:
        return ON_ANSWER(state);
    case REJECTED:
        return state == CANCELLED ? Step{OVER, PROCEED} : ONLY_IN(INVITE_SENT, state, {OVER, PROCEED});
    case ACK_IN:
        return ONLY_IN(ANSWERED, state, {UP, PROCEED});
    case ACK_MISSING:
        return ONLY_IN(ANSWERED, state, {BYE_SENT, SEND_BYE});
    case CANCEL_IN:
        return ONLY_IN(INVITE_RECEIVED, state, {OVER, TERMINATE});
    case BYE_IN:
        return ON_BYE(state);
    case END:
        return ON_END(state);
    case BYE_DONE:
        return ONLY_IN(BYE_SENT, state, {OVER, PROCEED});
    case TIMEOUT:
        return ON_TIMEOUT(state);
    }
    return {state, IGNORE};
}

char const* SipDialogState::NAME(State state) { return state >= NONE && state <= OVER ? NAMES[state] : "(unknown)"; }
