#pragma once

/// How a call goes on on the wire (Q.931, 5; the numbers are those of its states on the user's side, which the network
/// side mirrors). What the table leaves out is passed over: the state stays.
///
///     | received              | SETUP_ACK | PROC.  | PROG. | ALERT. | CONNECT | digits  | DISCONNECT | released |
///     | NULL 0                |           |        |       |        |         |         |            | OVER     |
///     | CALL_INITIATED 1      | 2 dial on | 3 tell | tell  | 4 tell | 10 tell |         | 19 release | OVER     |
///     | OVERLAP_SENDING 2     |           | 3 tell | tell  | 4 tell | 10 tell |         | 19 release | OVER     |
///     | OUTGOING_PROCEEDING 3 |           |        | tell  | 4 tell | 10 tell |         | 19 release | OVER     |
///     | CALL_DELIVERED 4      |           |        | tell  |        | 10 tell |         | 19 release | OVER     |
///     | CALL_PRESENT 6        |           |        |       |        |         |         | 19 release | OVER     |
///     | OVERLAP_RECEIVING 25  |           |        |       |        |         | collect | 19 release | OVER     |
///     | INCOMING_PROCEEDING 9 |           |        |       |        |         |         | 19 release | OVER     |
///     | CALL_RECEIVED 7       |           |        |       |        |         |         | 19 release | OVER     |
///     | ACTIVE 10             |           |        |       |        |         | tell    | 19 release | OVER     |
///     | CLEARING 11, 19       |           |        |       |        |         |         | release    | OVER     |
///
///     |                       | SETUP | SETUP_ACK | PROCEEDING | PROGRESS | ALERTING | CONNECT | clearing |
///     |                       | sent  | sent      | sent       | sent     | sent     | sent    | asked for |
///     | NULL 0                | 1     |           |            |          |          |         | OVER     |
///     | CALL_INITIATED 1      |       |           |            |          |          |         | 11       |
///     | OVERLAP_SENDING 2     |       |           |            |          |          |         | 11       |
///     | OUTGOING_PROCEEDING 3 |       |           |            |          |          |         | 11       |
///     | CALL_DELIVERED 4      |       |           |            |          |          |         | 11       |
///     | CALL_PRESENT 6        |       | 25        | 9          |          | 7        | 10      | 11       |
///     | OVERLAP_RECEIVING 25  |       |           | 9          | send     | 7        | 10      | 11       |
///     | INCOMING_PROCEEDING 9 |       |           |            | send     | 7        | 10      | 11       |
///     | CALL_RECEIVED 7       |       |           |            | send     |          | 10      | 11       |
///     | ACTIVE 10             |       |           |            |          |          |         | 11       |
///
/// CONNECT is acknowledged, and what comes between DISCONNECT and the end is done, by the stack.
namespace IsdnCallState
{
enum State
{
    NULL_STATE,
    CALL_INITIATED,
    OVERLAP_SENDING,
    OUTGOING_PROCEEDING,
    CALL_DELIVERED,
    CALL_PRESENT,
    OVERLAP_RECEIVING,
    INCOMING_PROCEEDING,
    CALL_RECEIVED,
    ACTIVE,
    CLEARING,
    OVER
};

enum Event
{
    SETUP_ACK_IN,
    PROCEEDING_IN,
    PROGRESS_IN,
    ALERTING_IN,
    CONNECT_IN,
    DIGITS_IN,
    DISCONNECT_IN,
    RELEASED_IN,
    SETUP_OUT,
    SETUP_IN,
    SETUP_ACK_OUT,
    PROCEEDING_OUT,
    PROGRESS_OUT,
    ALERTING_OUT,
    CONNECT_OUT,
    CLEAR_OUT
};

enum Action
{
    IGNORE,    ///< not now
    GO_ON,     ///< tell the other side, or send it
    DIAL_ON,   ///< send the digits that wait
    COLLECT,   ///< they belong to the called number
    RELEASE,   ///< answer with RELEASE
    DISCONNECT ///< or what stands for it: RELEASE COMPLETE for a call that is not answered yet
};

struct Step
{
    State next;
    Action action;
};

Step STEP(State state, Event event);
char const* NAME(State state);
} // namespace IsdnCallState
