#include "platform/eventloop/TYEventLoop.h"

#include "platform/base/Assert.h"

#include <algorithm>
#include <cstdint>
#include <new>
#include <sys/eventfd.h>
#include <tuple>
#include <unistd.h>

TYEventLoop::TYEventLoop() : m_thread(std::this_thread::get_id())
{
    for (unsigned int priority = 0; priority < EventPrio::COUNT; ++priority)
    {
        m_syncEvents[priority].m_loop = this;
        m_syncEvents[priority].m_priority = static_cast<EventPrio::Type>(priority);
    }
}

TYEventLoop::~TYEventLoop()
{
    std::unique_lock lock(m_mutex);
    m_isEnded = true;
    m_syncEnded.notify_all();
    m_syncEnded.wait(lock, [this] { return m_waiting == 0; });
    for (LinkedListManager_Untyped& queue : m_pending)
        while (!queue.isEmpty())
        {
            TYEvent& event = static_cast<TYEvent&>(*queue.getFirst());
            queue.unlink(event);
            event.m_isPending = false;
        }
    if (m_pollFd >= 0)
        close(m_pollFd);
}

void TYEventLoop::run()
{
    m_thread.store(std::this_thread::get_id(), std::memory_order_relaxed);
    for (;;)
    {
        {
            std::unique_lock lock(m_mutex);
            m_isSleeping = true;
            m_wakeUp.wait(lock, [this] { return m_isStopped || hasPending(); });
            m_isSleeping = false;
            if (m_isStopped)
            {
                m_isStopped = false;
                return;
            }
        }
        runTurn();
    }
}

void TYEventLoop::stop()
{
    std::lock_guard const lock(m_mutex);
    m_isStopped = true;
    m_wakeUp.notify_all();
}

bool TYEventLoop::runTurn()
{
    TY_ASSERT(!m_isInTurn, "a turn inside a turn");
    m_thread.store(std::this_thread::get_id(), std::memory_order_relaxed);

    takeTurn();
    bool const hadWork = !m_turn.isEmpty();
    m_isInTurn = true;
    while (!m_turn.isEmpty())
    {
        TYEvent& event = static_cast<TYEvent&>(*m_turn.getFirst());
        m_turn.unlink(event);
        event.m_isInTurn = false;
        event.m_isPending.exchange(false); // no plain store: it pairs with the exchange of whoever posts
        event.addReference();
        event.handle();
        event.removeReference();
    }
    m_isInTurn = false;
    return hadWork;
}

void TYEventLoop::takeTurn()
{
    if (!m_wasPosted.load(std::memory_order_acquire))
        return; // without the lock: a host's loop asks often
    std::lock_guard const lock(m_mutex);
    m_wasPosted.store(false, std::memory_order_relaxed);
    resetPollFd();
    for (LinkedListManager_Untyped& queue : m_pending)
    {
        if (queue.isEmpty())
            continue;
        for (LinkedListElement_Untyped* element = queue.getFirst(); element != queue.getEnd();
             element = queue.getNext(*element))
            static_cast<TYEvent&>(*element).m_isInTurn = true;
        m_turn.takeAll(queue);
    }
}

int TYEventLoop::getPollFd()
{
    std::lock_guard const lock(m_mutex);
    if (m_pollFd < 0)
    {
        m_pollFd = eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC);
        if (hasPending())
            setPollFd();
    }
    return m_pollFd;
}

TYSyncEvent& TYEventLoop::getSyncEvent(EventPrio::Type priority)
{
    TY_ASSERT(priority < EventPrio::COUNT, "a synchronisation event of a priority that the loop does not have");
    return m_syncEvents[std::min<unsigned int>(priority, EventPrio::COUNT - 1)];
}

/// For the one who made the event pending.
XCode TYEventLoop::post(TYEvent& event)
{
    std::lock_guard const lock(m_mutex);
    if (event.m_isDestroyed)
    {
        event.m_isPending = false;
        return XCode::REFUSED;
    }
    std::ignore = m_pending[event.m_priority].append(event); // it was not pending, so it is in no list
    m_wasPosted.store(true, std::memory_order_release);
    wake();
    return XCode::OK;
}

void TYEventLoop::withdraw(TYEvent& event)
{
    std::lock_guard const lock(m_mutex);
    event.m_isDestroyed = true;
    if (event.isLinked())
        (event.m_isInTurn ? m_turn : m_pending[event.m_priority]).unlink(event);
    event.m_isPending = false;
    event.m_isInTurn = false;
    if (!hasPending())
        resetPollFd();
}

bool TYEventLoop::hasPending() const
{
    return std::any_of(m_pending.begin(), m_pending.end(), [](auto const& queue) { return !queue.isEmpty(); });
}

// This and the next two with the lock held. A loop whose descriptor nobody asked for pays for no system call.
void TYEventLoop::wake()
{
    if (m_isSleeping)
        m_wakeUp.notify_one();
    setPollFd();
}

void TYEventLoop::setPollFd()
{
    if (m_pollFd >= 0 && !m_isPollFdSet)
    {
        std::uint64_t const one = 1;
        std::ignore = write(m_pollFd, &one, sizeof one); // an eventfd at 0 takes a 1
        m_isPollFdSet = true;
    }
}

void TYEventLoop::resetPollFd()
{
    if (m_isPollFdSet)
    {
        std::uint64_t count = 0;
        std::ignore = read(m_pollFd, &count, sizeof count); // only to make it unreadable again
        m_isPollFdSet = false;
    }
}

namespace
{
/// A function on its way to the loop. Both the waiting caller and the turn that runs it hold a reference on it: the
/// caller may go on as soon as it is done, while the turn has yet to let go of it.
class SyncRun : public TYEvent
{
public:
    SyncRun(TYEventLoop& loop, EventPrio::Type priority, Callback function, void* argument, std::mutex& mutex,
            std::condition_variable& ended)
        : TYEvent(loop, priority, function, argument), m_mutex(mutex), m_ended(ended)
    {
    }
    ~SyncRun() override = default;

    bool m_isDone = false;

protected:
    void handle() override
    {
        TYEvent::handle();
        std::lock_guard const lock(m_mutex);
        m_isDone = true;
        m_ended.notify_all();
    }

private:
    std::mutex& m_mutex;
    std::condition_variable& m_ended;
};
} // namespace

XCode TYSyncEvent::run(TYEvent::Callback function, void* argument)
{
    if (m_loop->isLoopThread())
    {
        function(argument);
        return XCode::OK;
    }
    SyncRun* const event =
        new (std::nothrow) SyncRun(*m_loop, m_priority, function, argument, m_loop->m_mutex, m_loop->m_syncEnded);
    if (event == nullptr)
        return XCode::NO_ELEMENT;
    {
        std::lock_guard const lock(m_loop->m_mutex);
        ++m_loop->m_waiting;
    }
    XCode result = event->setIfNotPending();
    std::unique_lock lock(m_loop->m_mutex);
    m_loop->m_syncEnded.wait(lock, [&] { return event->m_isDone || m_loop->m_isEnded; });
    if (!event->m_isDone)
        result = XCode::FAILURE;
    lock.unlock();
    event->destroy();
    lock.lock();
    if (--m_loop->m_waiting == 0)
        m_loop->m_syncEnded.notify_all();
    return result;
}
