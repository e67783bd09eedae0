#pragma once

#include "platform/base/Export.h"
#include "platform/base/LinkedListManager.h"
#include "platform/base/XCode.h"
#include "platform/eventloop/TYEvent.h"
#include "platform/eventloop/TYSyncEvent.h"

#include <array>
#include <atomic>
#include <condition_variable>
#include <mutex>
#include <thread>

/// One thread's queue of events.
///
/// A turn takes the events that are pending when it begins, those of a lower priority value first and in posting order
/// within a priority; what is posted during a turn runs in the next one. Posting and synchronisation events may be used
/// from any thread; everything else belongs to the loop's thread: the one that created it, or the last one to run it.
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
    /// Callers that wait on a synchronisation event get their FAILURE; pending events do not run.
    ~TYEventLoop();
    TYEventLoop(TYEventLoop const&) = delete;
    TYEventLoop& operator=(TYEventLoop const&) = delete;

    /// Runs turns, sleeping while nothing is pending, until `stop()`.
    void run();
    /// Ends `run()` after the turn that is under way. From any thread; also before `run()`, which then ends at once.
    void stop();
    /// Runs one turn without waiting: whether there was anything to do. Not from inside a handler.
    bool runTurn();
    /// A descriptor that is readable exactly while work is pending, for poll() and its kin; -1 when the system has none
    /// left. Do not read from it: `runTurn()` does.
    /// Call it once before other threads post; it lives as long as the loop.
    int getPollFd();

    /// The loop's synchronisation event of that priority; it lives as long as the loop.
    TYSyncEvent& getSyncEvent(EventPrio::Type priority);
    bool isLoopThread() const { return m_thread.load(std::memory_order_relaxed) == std::this_thread::get_id(); }

private:
    friend class TYEvent;
    friend class TYSyncEvent;

    void takeTurn();
    XCode post(TYEvent& event);
    void withdraw(TYEvent& event);
    bool hasPending() const;
    void wake();
    void setPollFd();
    void resetPollFd();

    mutable std::mutex m_mutex;
    std::condition_variable m_wakeUp;    // of run()
    std::condition_variable m_syncEnded; // of the callers of synchronisation events
    std::array<LinkedListManager_Untyped, EventPrio::COUNT> m_pending;
    LinkedListManager_Untyped m_turn; // what the running turn has taken and not yet run; the loop's thread
    TYSyncEvent m_syncEvents[EventPrio::COUNT];
    std::atomic<bool> m_wasPosted{false}; // since a turn last took what was pending
    std::atomic<std::thread::id> m_thread;
    int m_pollFd = -1;
    unsigned int m_waiting = 0; // callers inside a synchronisation event
    bool m_isSleeping = false;  // run() waits for work
    bool m_isPollFdSet = false;
    bool m_isStopped = false;
    bool m_isEnded = false;
    bool m_isInTurn = false;
};
