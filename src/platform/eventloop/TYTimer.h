#pragma once

#include "platform/base/Export.h"
#include "platform/base/LinkedListManager.h"
#include "platform/base/XCode.h"
#include "platform/eventloop/TYEvent.h"

class TYEventLoop;

/// Calls a function on an event loop's thread when a time has passed, once or again and again.
///
/// A member of the object that waits, which its destructor stops. Time is that of `TY::Time::NOW(MONOTONIC)`, which
/// tests replace; a timer never runs early, and as late as the loop's turn comes. In a turn the due timers of a
/// priority run before its events, the one that was due first first. Starting, stopping and running need no memory, so
/// none of them can fail for want of it, and thousands of timers cost little (TYTimerQueue).
///
/// Everything belongs to the loop's thread, as a debug build asserts; a timer that does not run may be made and
/// destroyed on any. The loop must outlive the timer; one that runs when its loop is destroyed is stopped.
///
///     TYTimer m_answerTimer{loop, EventPrio::NORMAL, ON_NO_ANSWER, this};
///     m_answerTimer.start(30000);  // ON_NO_ANSWER(this) runs in 30 s, once,
///     m_answerTimer.stop();        // unless it is stopped; or destroyed
class CC_EXPORT TYTimer : private LinkedListElement_Untyped
{
public:
    /// What a timer runs, on the loop's thread.
    using Callback = void (*)(void* argument);

    /// `callback` is called with `argument`, in the turn's place of `priority`. It must not throw. Inside it anything
    /// may be done: stop, start or destroy this timer, or others.
    TYTimer(TYEventLoop& loop, EventPrio::Type priority, Callback callback, void* argument);
    ~TYTimer();
    TYTimer(TYTimer const&) = delete;
    TYTimer& operator=(TYTimer const&) = delete;

    /// Runs once, in that many milliseconds (0 to 4294967295, 49 days): 0 is the loop's next turn. A timer that runs
    /// already starts anew.
    void start(unsigned int milliseconds);
    /// Runs every `period` milliseconds (1 to 4294967295), the first time in one period: OK; REFUSED for the period 0,
    /// which leaves the timer as it was. A timer that runs already starts anew.
    ///
    /// It is due at whole multiples of the period after its start, so it never drifts. A loop that was late runs it
    /// once, not once for each time that has gone by: these are skipped and counted.
    XCode startPeriodic(unsigned int period);
    /// Takes it back, also when it is due and the running turn has not yet reached it.
    void stop();

    /// Whether it will run (again). Inside the handler: false for one that runs once, true for a periodic one.
    bool isRunning() const { return m_state != State::STOPPED; }
    /// How many times of a periodic timer were skipped since it was started.
    unsigned long long getNumberOfMissed() const { return m_missed; }

private:
    friend class TYEventLoop;
    friend class TYTimerQueue;

    enum class State : unsigned char
    {
        STOPPED,
        WAITING, // in the loop's queue
        DUE      // taken into the running turn
    };

    void startWith(unsigned int milliseconds, unsigned int period);

    TYEventLoop& m_loop;
    Callback m_callback;
    void* m_argument;
    long long m_due = 0;    // in nanoseconds of the monotonic clock
    long long m_period = 0; // in nanoseconds; 0: once
    unsigned long long m_missed = 0;
    unsigned long long m_order = 0; // among timers due at the same moment
    // the queue's links: the first of those below it, the next beside it, the one before it or, for the first, above it
    TYTimer* m_child = nullptr;
    TYTimer* m_sibling = nullptr;
    TYTimer* m_before = nullptr;
    unsigned char m_priority;
    State m_state = State::STOPPED;
};
