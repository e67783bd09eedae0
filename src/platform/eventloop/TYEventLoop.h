#pragma once

#include "platform/base/Export.h"
#include "platform/base/LinkedListManager.h"
#include "platform/base/XCode.h"
#include "platform/eventloop/TYEvent.h"
#include "platform/eventloop/TYSyncEvent.h"
#include "platform/eventloop/TYTimerQueue.h"

#include <array>
#include <atomic>
#include <condition_variable>
#include <mutex>
#include <thread>

/// One thread's queue of events and timers.
///
/// A turn takes the events that are pending and the timers that are due when it begins, those of a lower priority value
/// first; within a priority the timers in the order of their times, then the events in the order of posting. What is
/// posted or started during a turn runs in a later one. Posting and synchronisation events may be used from any thread;
/// everything else belongs to the loop's thread: the one that created it, or the last one to run it.
///
/// On its own:                          Inside another loop (epoll, a protocol stack's):
///
///     TYEventLoop loop;                    TYEventLoop loop;
///     loop.run(); // until stop()          // when loop.getPollFd() is readable:
///                                          loop.runTurn();
class CC_EXPORT TYEventLoop
{
public:
    TYEventLoop();
    /// Callers that wait on a synchronisation event get their FAILURE; pending events do not run, timers are stopped.
    ~TYEventLoop();
    TYEventLoop(TYEventLoop const&) = delete;
    TYEventLoop& operator=(TYEventLoop const&) = delete;

    /// Runs turns, sleeping while nothing is pending and no timer due, until `stop()`.
    void run();
    /// Ends `run()` after the turn that is under way. From any thread; also before `run()`, which then ends at once.
    void stop();
    /// Runs one turn without waiting: whether there was anything to do. Not from inside a handler. An exception of a
    /// handler leaves it, and the turn is over; what has not run then is the next turn's.
    bool runTurn();
    /// A descriptor that is readable exactly while work is pending or a timer due, for poll() and its kin; -1 when the
    /// system has none left (it takes three). Do not read from it: `runTurn()` does. A timer that was stopped may make
    /// it readable once more, for a turn without work.
    /// Call it once before other threads post; it lives as long as the loop. While a replaced clock is moved by hand
    /// every call looks at it again, since the system cannot know that a timer has become due.
    int getPollFd();
    /// A host that runs turns itself before it waits says so, and saves the system calls that the descriptor costs:
    /// from `beginBusy()` on, what the loop's own thread posts does not make it readable. `endBusy()` runs turns as
    /// long as something was posted, a few at most, so that the host is heard as well; for what is left then the
    /// descriptor is readable. Not from inside a handler.
    ///
    ///     loop.beginBusy();
    ///     ... // what the host has to do, which posts
    ///     loop.endBusy(); // then it waits
    ///
    /// @{
    void beginBusy() { m_isBusy = true; }
    void endBusy();
    /// @}
    /// For how many milliseconds the loop wants no turn, rounded up: 0 when work is pending or a timer due, -1 when
    /// there is neither work nor a timer that runs. For hosts whose wait takes such a number (epoll_wait, poll); events
    /// that other threads post meanwhile they learn from `getPollFd()` alone.
    int getTimeout() const;

    /// The loop's synchronisation event of that priority; it lives as long as the loop.
    TYSyncEvent& getSyncEvent(EventPrio::Type priority);
    /// Whether the calling thread is the loop's: the one that created it or the last to run it.
    bool isLoopThread() const { return m_thread.load(std::memory_order_relaxed) == std::this_thread::get_id(); }

    /// How many turns have begun; the loop's thread. It tells which turn something belongs to.
    unsigned long long getNumberOfTurns() const { return m_turns; }
    /// Whether a turn is under way; the loop's thread. Otherwise the host, or the one that made the loop, is at work.
    bool isInTurn() const { return m_isInTurn; }
    /// What time it is, in nanoseconds of the monotonic clock; the loop's thread. In a turn that of its first reading,
    /// so that all that a turn does has one time; between turns that of the system's last tick, at most 10 ms ago.
    long long getTime()
    {
        if (!m_isInTurn || m_turnTime == NEVER)
            readTime();
        return m_turnTime;
    }

private:
    friend class TYEvent;
    friend class TYSyncEvent;
    friend class TYTimer;

    static constexpr long long NEVER = -1; // no moment of the clock, in nanoseconds

    void readTime();
    void takeTurn();
    void runFirstEvent();
    void leaveTurn();
    /// Whether timers run, or the descriptor is armed for one that did.
    bool hasTimers() const { return !m_timers.isEmpty() || m_armed != NEVER; }
    __attribute__((noinline)) bool runTurnWithTimers();
    void sleep(std::unique_lock<std::mutex>& lock);
    void startTimer(TYTimer& timer, long long nanoseconds);
    void stopTimer(TYTimer& timer);
    void takeDueTimers();
    bool runDueTimers(unsigned int priority);
    void settleTimers(bool hadWork);
    bool isTimerDue() const;
    long long getNanosecondsToTimer() const;
    void armTimerFd(long long due);
    void signalTimer();
    bool isPollFdNeeded() const { return !(m_isBusy && isLoopThread()); }
    XCode post(TYEvent& event);
    void withdraw(TYEvent& event);
    bool hasPending() const;
    void wake();
    void openPollFd();
    void closePollFd();
    void setPollFd();
    void resetPollFd();

    mutable std::mutex m_mutex;
    std::condition_variable m_wakeUp;    // of run()
    std::condition_variable m_syncEnded; // of the callers of synchronisation events
    std::array<LinkedListManager_Untyped, EventPrio::COUNT> m_pending;
    LinkedListManager_Untyped m_turn; // what the running turn has taken and not yet run; the loop's thread
    TYSyncEvent m_syncEvents[EventPrio::COUNT];
    TYTimerQueue m_timers;                                               // this and the next three: the loop's thread
    std::array<LinkedListManager_Untyped, EventPrio::COUNT> m_dueTimers; // taken into the running turn
    unsigned int m_numberOfDueTimers = 0;
    long long m_armed = NEVER;            // when the timer descriptor becomes readable
    std::atomic<bool> m_wasPosted{false}; // since a turn last took what was pending
    std::atomic<std::thread::id> m_thread;
    int m_pollFd = -1;  // an epoll descriptor that holds the next two
    int m_eventFd = -1; // readable while m_isPollFdSet
    int m_timerFd = -1;
    unsigned int m_waiting = 0; // callers inside a synchronisation event
    bool m_isSleeping = false;  // run() waits for work
    bool m_isPollFdSet = false;
    bool m_isTimerSignalled = false; // the event descriptor tells of a timer that is due already
    bool m_isStopped = false;
    bool m_isEnded = false;
    bool m_isInTurn = false;
    bool m_isBusy = false;          // the loop's thread
    unsigned long long m_turns = 0; // that have begun
    long long m_turnTime = NEVER;   // what the turn has read, or who asked last between turns
};
