#include "platform/eventloop/TYEventLoop.h"

#include "platform/base/Assert.h"
#include "platform/base/TYTime.h"
#include "platform/eventloop/TYTimer.h"

#include <algorithm>
#include <chrono>
#include <climits>
#include <cstdint>
#include <new>
#include <sys/epoll.h>
#include <sys/eventfd.h>
#include <sys/timerfd.h>
#include <tuple>
#include <unistd.h>

namespace
{
constexpr long long NANOSECONDS_IN_SECOND = 1000000000;
constexpr long long NANOSECONDS_IN_MILLISECOND = 1000000;
constexpr unsigned int MOST_BUSY_TURNS = 8;

long long NOW(TY::Time::Source source = TY::Time::MONOTONIC)
{
    TY::Time const now = TY::Time::NOW(source);
    return now.seconds * NANOSECONDS_IN_SECOND + now.nanoseconds;
}

bool WATCH(int epollFd, int fd)
{
    epoll_event event{};
    event.events = EPOLLIN;
    return epoll_ctl(epollFd, EPOLL_CTL_ADD, fd, &event) == 0;
}
} // namespace

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
    while (TYTimer* const timer = m_timers.getFirst())
    {
        m_timers.remove(*timer);
        timer->m_state = TYTimer::State::STOPPED;
    }
    closePollFd();
}

void TYEventLoop::run()
{
    m_thread.store(std::this_thread::get_id(), std::memory_order_relaxed);
    for (;;)
    {
        {
            std::unique_lock lock(m_mutex);
            sleep(lock);
            if (m_isStopped)
            {
                m_isStopped = false;
                return;
            }
        }
        runTurn();
    }
}

void TYEventLoop::sleep(std::unique_lock<std::mutex>& lock)
{
    auto const hasReason = [this] { return m_isStopped || hasPending(); };
    m_isSleeping = true;
    if (m_timers.isEmpty())
        m_wakeUp.wait(lock, hasReason);
    else
        m_wakeUp.wait_for(lock, std::chrono::nanoseconds(getNanosecondsToTimer()), hasReason);
    m_isSleeping = false;
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
    ++m_turns;
    m_turnTime = NEVER;
    if (hasTimers())
        return runTurnWithTimers();
    bool const hadWork = !m_turn.isEmpty();
    m_isInTurn = true;
    try
    {
        while (!m_turn.isEmpty())
            runFirstEvent();
    }
    catch (...)
    {
        leaveTurn();
        throw;
    }
    m_isInTurn = false;
    return hadWork;
}

void TYEventLoop::endBusy()
{
    struct End
    {
        ~End() { isBusy = false; }
        bool& isBusy;
    } const end{m_isBusy};
    for (unsigned int i = 0; i < MOST_BUSY_TURNS && m_wasPosted.load(std::memory_order_acquire); ++i)
        runTurn();
    if (!m_wasPosted.load(std::memory_order_acquire))
        return;
    std::lock_guard const lock(m_mutex);
    if (hasPending() || m_isTimerSignalled)
        setPollFd();
}

/// Whoever called `runTurn` hears of a handler's exception. What has not run yet is the next turn's.
[[gnu::cold]] void TYEventLoop::leaveTurn()
{
    m_isInTurn = false;
    for (LinkedListManager_Untyped& due : m_dueTimers)
        while (!due.isEmpty())
        {
            TYTimer& timer = static_cast<TYTimer&>(*due.getFirst());
            due.unlink(timer);
            --m_numberOfDueTimers;
            timer.m_state = TYTimer::State::WAITING;
            m_timers.add(timer);
        }
    settleTimers(true);
    std::lock_guard const lock(m_mutex);
    while (!m_turn.isEmpty())
    {
        unsigned int const priority = static_cast<TYEvent&>(*m_turn.getFirst()).m_priority;
        LinkedListManager_Untyped rest; // before what was posted meanwhile
        while (!m_turn.isEmpty() && static_cast<TYEvent&>(*m_turn.getFirst()).m_priority == priority)
        {
            TYEvent& event = static_cast<TYEvent&>(*m_turn.getFirst());
            m_turn.unlink(event);
            event.m_isInTurn = false;
            std::ignore = rest.append(event); // it is in no list
        }
        rest.takeAll(m_pending[priority]);
        m_pending[priority].takeAll(rest);
    }
    m_wasPosted.store(true, std::memory_order_release);
    if (hasPending())
        setPollFd();
}

/// A function of its own, so that turns without timers, which are most, pay one comparison for them.
bool TYEventLoop::runTurnWithTimers()
{
    takeDueTimers();
    bool const hadWork = !m_turn.isEmpty() || m_numberOfDueTimers != 0;
    m_isInTurn = true;
    try
    {
        while (!m_turn.isEmpty())
        {
            unsigned int const priority = static_cast<TYEvent&>(*m_turn.getFirst()).m_priority;
            if (m_numberOfDueTimers == 0 || !runDueTimers(priority)) // what ran may have destroyed the event
                runFirstEvent();
        }
        runDueTimers(EventPrio::COUNT - 1);
    }
    catch (...)
    {
        leaveTurn();
        throw;
    }
    settleTimers(hadWork);
    m_isInTurn = false;
    return hadWork;
}

void TYEventLoop::runFirstEvent()
{
    TYEvent& event = static_cast<TYEvent&>(*m_turn.getFirst());
    m_turn.unlink(event);
    event.m_isInTurn = false;
    event.m_isPending.exchange(false); // no plain store: it pairs with the exchange of whoever posts
    struct Reference
    {
        explicit Reference(TYEvent& held) : m_event(held) { m_event.addReference(); }
        ~Reference() { m_event.removeReference(); }
        TYEvent& m_event;
    } const keepEvent(event);
    event.handle();
}

// Between turns the coarse clock may be behind what the turn before has read; time does not go back.
void TYEventLoop::readTime()
{
    m_turnTime = m_isInTurn ? NOW(TY::Time::MONOTONIC) : std::max(m_turnTime, NOW(TY::Time::MONOTONIC_COARSE));
}

void TYEventLoop::takeTurn()
{
    if (!m_wasPosted.load(std::memory_order_acquire))
        return; // without the lock: a host's loop asks often
    std::lock_guard const lock(m_mutex);
    m_wasPosted.store(false, std::memory_order_relaxed);
    m_isTimerSignalled = false;
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
    if (m_pollFd < 0)
        openPollFd();
    if (m_pollFd >= 0 && isTimerDue())
        signalTimer();
    return m_pollFd;
}

void TYEventLoop::openPollFd()
{
    std::lock_guard const lock(m_mutex);
    m_pollFd = epoll_create1(EPOLL_CLOEXEC);
    m_eventFd = eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC);
    m_timerFd = timerfd_create(CLOCK_MONOTONIC, TFD_NONBLOCK | TFD_CLOEXEC);
    if (m_pollFd < 0 || !WATCH(m_pollFd, m_eventFd) || !WATCH(m_pollFd, m_timerFd))
        return closePollFd();
    if (hasPending())
        setPollFd();
    if (TYTimer const* const first = m_timers.getFirst())
        armTimerFd(first->m_due);
}

void TYEventLoop::closePollFd()
{
    for (int* const fd : {&m_pollFd, &m_eventFd, &m_timerFd})
    {
        if (*fd >= 0)
            close(*fd);
        *fd = -1;
    }
}

int TYEventLoop::getTimeout() const
{
    if (m_wasPosted.load(std::memory_order_acquire))
    {
        std::lock_guard const lock(m_mutex);
        if (hasPending())
            return 0;
    }
    if (m_timers.isEmpty())
        return -1;
    long long const milliseconds =
        (getNanosecondsToTimer() + NANOSECONDS_IN_MILLISECOND - 1) / NANOSECONDS_IN_MILLISECOND;
    return static_cast<int>(std::min<long long>(milliseconds, INT_MAX));
}

void TYEventLoop::startTimer(TYTimer& timer, long long nanoseconds)
{
    TY_ASSERT(isLoopThread(), "a timer started on another thread than its loop's");
    timer.m_due = NOW() + nanoseconds;
    timer.m_state = TYTimer::State::WAITING;
    m_timers.add(timer);
    if (m_pollFd < 0 || m_timers.getFirst() != &timer)
        return;
    if (nanoseconds == 0)
        signalTimer();
    else if (m_armed == NEVER || timer.m_due < m_armed)
        armTimerFd(timer.m_due);
}

// Leaves the timer descriptor armed: a timer that guards something is stopped far more often than it runs, and the
// next start needs the descriptor again.
void TYEventLoop::stopTimer(TYTimer& timer)
{
    TY_ASSERT(isLoopThread(), "a timer stopped on another thread than its loop's");
    if (timer.m_state == TYTimer::State::DUE)
    {
        m_dueTimers[timer.m_priority].unlink(timer);
        --m_numberOfDueTimers;
    }
    else
        m_timers.remove(timer);
    timer.m_state = TYTimer::State::STOPPED;
    if (m_isTimerSignalled && !isTimerDue())
    {
        std::lock_guard const lock(m_mutex);
        m_isTimerSignalled = false;
        if (!hasPending())
            resetPollFd();
    }
}

void TYEventLoop::takeDueTimers()
{
    long long const now = NOW();
    for (TYTimer* timer = m_timers.getFirst(); timer != nullptr && timer->m_due <= now; timer = m_timers.getFirst())
    {
        m_timers.remove(*timer);
        timer->m_state = TYTimer::State::DUE;
        std::ignore = m_dueTimers[timer->m_priority].append(*timer); // it is in no list
        ++m_numberOfDueTimers;
        if (timer->m_period != 0)
        {
            timer->m_missed += static_cast<unsigned long long>((now - timer->m_due) / timer->m_period);
            timer->m_due = now - (now - timer->m_due) % timer->m_period;
        }
    }
}

/// Runs those that are due, up to that priority: whether there was one.
bool TYEventLoop::runDueTimers(unsigned int priority)
{
    bool hasRun = false;
    for (unsigned int i = 0; i <= priority; ++i)
        while (!m_dueTimers[i].isEmpty())
        {
            TYTimer& timer = static_cast<TYTimer&>(*m_dueTimers[i].getFirst());
            m_dueTimers[i].unlink(timer);
            --m_numberOfDueTimers;
            timer.m_state = TYTimer::State::STOPPED;
            if (timer.m_period != 0)
            {
                timer.m_due += timer.m_period;
                timer.m_state = TYTimer::State::WAITING;
                m_timers.add(timer);
            }
            timer.m_callback(timer.m_argument); // which may destroy it
            hasRun = true;
        }
    return hasRun;
}

/// After a turn: lets the timer descriptor wait for the timer that is now the first.
void TYEventLoop::settleTimers(bool hadWork)
{
    if (m_pollFd < 0 || m_isTimerSignalled)
        return;
    TYTimer const* const first = m_timers.getFirst();
    bool const isArmedForNothing = m_armed != NEVER && (!hadWork || m_armed <= NOW());
    if (isArmedForNothing || (first != nullptr && (m_armed == NEVER || first->m_due < m_armed)))
        armTimerFd(first != nullptr ? first->m_due : NEVER);
}

bool TYEventLoop::isTimerDue() const { return !m_timers.isEmpty() && m_timers.getFirst()->m_due <= NOW(); }

/// 0 when it is due. REQUIRES: a timer runs.
long long TYEventLoop::getNanosecondsToTimer() const { return std::max(m_timers.getFirst()->m_due - NOW(), 0LL); }

void TYEventLoop::armTimerFd(long long due)
{
    // by the time that is left and not by the moment: a replaced clock need not agree with the system's
    long long const rest = due == NEVER ? 0 : std::max(due - NOW(), 1LL);
    itimerspec setting{};
    setting.it_value.tv_sec = static_cast<std::time_t>(rest / NANOSECONDS_IN_SECOND);
    setting.it_value.tv_nsec = static_cast<long>(rest % NANOSECONDS_IN_SECOND);
    std::ignore = timerfd_settime(m_timerFd, 0, &setting, nullptr); // no argument that it could refuse
    m_armed = due;
}

/// A timer that is due already makes the descriptor readable at once, which the timer descriptor would do a moment
/// later.
void TYEventLoop::signalTimer()
{
    std::lock_guard const lock(m_mutex);
    m_isTimerSignalled = true;
    m_wasPosted.store(true, std::memory_order_release); // so that the next turn makes it unreadable
    if (isPollFdNeeded())
        setPollFd();
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
    if (!hasPending() && !m_isTimerSignalled)
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
    if (isPollFdNeeded())
        setPollFd();
}

void TYEventLoop::setPollFd()
{
    if (m_eventFd >= 0 && !m_isPollFdSet)
    {
        std::uint64_t const one = 1;
        std::ignore = write(m_eventFd, &one, sizeof one); // an eventfd at 0 takes a 1
        m_isPollFdSet = true;
    }
}

void TYEventLoop::resetPollFd()
{
    if (m_isPollFdSet)
    {
        std::uint64_t count = 0;
        std::ignore = read(m_eventFd, &count, sizeof count); // only to make it unreadable again
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
