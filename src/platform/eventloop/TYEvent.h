#pragma once

#include "platform/base/Export.h"
#include "platform/base/LinkedListManager.h"
#include "platform/base/TYRecycled.h"
#include "platform/base/XCode.h"

#include <atomic>

class TYEventLoop;

/// The priorities of events and of a loop's synchronisation events. A lower value runs earlier in a turn.
struct EventPrio
{
    /// From the first to run to the last, and how many there are. @{
    enum Type : unsigned int
    {
        HIGHEST = 0,
        HIGH = 1,
        NORMAL = 2,
        LOW = 3
    };
    static constexpr unsigned int COUNT = 4;
    /// @}
};

/// Work to be done once on an event loop, however often it was asked for.
///
/// Reference counted: the creator holds the first reference and gives it up with `destroy()`. Posting never allocates
/// (the event is its own queue element) and may be done from any thread that knows the event to be alive; creating and
/// destroying belong to the loop's thread. The loop must outlive its events.
///
///     m_event = new TYEvent(loop, EventPrio::HIGH, CLEAN_UP, this);
///     std::ignore = m_event->setIfNotPending();  // CLEAN_UP(this) runs in the loop's next turn
///     m_event->destroy();                        // takes back a pending post; nothing runs afterwards
class CC_EXPORT TYEvent : private LinkedListElement_Untyped, public TYRecycled
{
public:
    /// What an event runs, on the loop's thread.
    using Callback = void (*)(void* argument);

    /// `callback` is called with `argument` by `handle()`.
    TYEvent(TYEventLoop& loop, EventPrio::Type priority, Callback callback, void* argument);
    TYEvent(TYEvent const&) = delete;
    TYEvent& operator=(TYEvent const&) = delete;

    /// Posts the event unless it is pending: OK also when it was. REFUSED after `destroy()`.
    XCode setIfNotPending();
    /// Takes back a pending post, also one that the running turn has not yet reached, and gives up the creator's
    /// reference. Safe from inside the event's own handler.
    void destroy();

    /// Whether it was posted and has not begun to run. From any thread.
    bool isPending() const { return m_isPending.load(); }
    /// References besides the creator's, which `destroy` gives up. The last one ends the event. @{
    void addReference();
    void removeReference();
    /// @}

    /// The number of events alive.
    static std::atomic<unsigned int> s_numberOfInstances;

protected:
    virtual ~TYEvent();
    /// Runs the work; the event is no longer pending by then. A derived class may override it.
    virtual void handle();

private:
    friend class TYEventLoop;

    TYEventLoop& m_loop;
    Callback m_callback;
    void* m_argument;
    std::atomic<int> m_references{1};
    unsigned char m_priority;
    // Whoever turns it from false to true brings the event into the queue; one atomic exchange is all that posting a
    // pending event costs (a fifth of the lock). What a poster wrote before it the handler sees, for the loop clears it
    // the same way.
    std::atomic<bool> m_isPending{false};
    bool m_isInTurn = false; // taken into the running turn; the loop's thread
    std::atomic<bool> m_isDestroyed{false};
};
