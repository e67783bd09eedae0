#pragma once

/// The states of one INVITE dialog and what an event does in each: the table by which an endpoint lives. A plain
/// function, so that each cell can be tried.
///
/// | | none | INVITE received | answered | INVITE sent | cancelled | up | BYE sent | over |
/// |---|---|---|---|---|---|---|---|---|
/// | INVITE received | INVITE received | - | - | - | - | - | - | - |
/// | INVITE sent | INVITE sent | - | - | - | - | - | - | - |
/// | 2xx sent | - | answered | - | - | - | - | - | - |
/// | 2xx received | - | - | - | up: ACK | BYE sent: ACK, BYE | ACK again | ACK again | - |
/// | rejected | - | - | - | over | over | - | - | - |
/// | ACK received | - | - | up | - | - | - | - | - |
/// | no ACK came | - | - | BYE sent: BYE | - | - | - | - | - |
/// | CANCEL received | - | over: 487 | - | - | - | - | - | - |
/// | BYE received | 481 | over: 200, 487 | over: 200 | 481 | 481 | over: 200 | 200 | 200 |
/// | the call ends | over | over: rejection | BYE when ACKed | cancelled: CANCEL | - | BYE sent: BYE | - | - |
/// | the BYE is done | - | - | - | - | - | - | over | - |
/// | no answer in time | - | - | - | CANCEL asked for | over | - | - | - |
///
/// A dialog that is up may be renegotiated, transferred and refreshed; that has states of its own and changes none of
/// these, except that it may end the call.
namespace SipDialogState
{
enum State : int
{
    NONE,
    INVITE_RECEIVED, ///< not answered finally
    ANSWERED,        ///< 200 sent, the ACK is outstanding
    INVITE_SENT,
    CANCELLED, ///< CANCEL sent, the INVITE's final answer is outstanding
    UP,
    BYE_SENT,
    OVER
};

enum Event
{
    INVITE_IN,
    INVITE_OUT,
    ANSWER_OUT, ///< 2xx
    ANSWER_IN,  ///< 2xx
    REJECTED,   ///< 300 to 699, or the peer's silence
    ACK_IN,
    ACK_MISSING,
    CANCEL_IN,
    BYE_IN,
    END, ///< the call ends on our side
    BYE_DONE,
    TIMEOUT ///< the answer to the INVITE, or to the CANCEL, does not come
};

enum Action
{
    IGNORE,
    PROCEED,   ///< what the event means by itself: an ACK for an answer, a 200 for a BYE
    TERMINATE, ///< the INVITE gets 487
    REJECT,    ///< the INVITE gets the cause's status
    REFUSE,    ///< 481
    SEND_CANCEL,
    SEND_BYE,
    BYE_AFTER_ACK, ///< a BYE must not overtake the 200
    ACK_AND_BYE,   ///< the answer crossed our CANCEL
    ACKNOWLEDGE,   ///< repeated: our ACK was lost
    GIVE_UP        ///< as if it had been rejected; to be asked for with END while the INVITE is not cancelled
};

struct Step
{
    State next;
    Action action;

    friend bool operator==(Step const&, Step const&) = default;
};

Step STEP(State state, Event event);
/// "INVITE received"; "(unknown)" for any other number.
char const* NAME(State state);
} // namespace SipDialogState
