#include "platform/eventloop/TYTimer.h"

#include "platform/base/Assert.h"
#include "platform/eventloop/TYEventLoop.h"

#include <algorithm>
#include <utility>

TYTimer::TYTimer(TYEventLoop& loop, EventPrio::Type priority, Callback callback, void* argument)
    : m_loop(loop)
    , m_callback(callback)
    , m_argument(argument)
    , m_priority(static_cast<unsigned char>(std::min<unsigned int>(priority, EventPrio::COUNT - 1)))
{
    TY_ASSERT(priority < EventPrio::COUNT, "a timer of a priority that the loop does not have");
}

TYTimer::~TYTimer() { stop(); }

void TYTimer::start(unsigned int milliseconds) { startWith(milliseconds, 0); }

XCode TYTimer::startPeriodic(unsigned int period)
{
    if (period == 0)
        return XCode::REFUSED;
    startWith(period, period);
    return XCode::OK;
}

void TYTimer::startWith(unsigned int milliseconds, unsigned int period)
{
    constexpr long long NANOSECONDS_IN_MILLISECOND = 1000000;
    stop();
    m_period = period * NANOSECONDS_IN_MILLISECOND;
    m_missed = 0;
    m_loop.startTimer(*this, milliseconds * NANOSECONDS_IN_MILLISECOND);
}

void TYTimer::stop()
{
    if (isRunning())
        m_loop.stopTimer(*this);
}

void TYTimerQueue::add(TYTimer& timer)
{
    timer.m_order = m_starts++;
    m_first = MELD(m_first, &timer);
}

void TYTimerQueue::remove(TYTimer& timer)
{
    TYTimer* const below = MELD_ALL(std::exchange(timer.m_child, nullptr));
    if (m_first == &timer)
    {
        m_first = below;
        return;
    }
    CUT(timer);
    m_first = MELD(m_first, below);
}

bool TYTimerQueue::IS_BEFORE(TYTimer const& left, TYTimer const& right)
{
    return left.m_due != right.m_due ? left.m_due < right.m_due : left.m_order < right.m_order;
}

/// Joins two heaps, either of which may be null: the later top goes below the earlier one.
TYTimer* TYTimerQueue::MELD(TYTimer* left, TYTimer* right)
{
    if (left == nullptr || right == nullptr)
        return left == nullptr ? right : left;
    if (IS_BEFORE(*right, *left))
        std::swap(left, right);
    right->m_before = left;
    right->m_sibling = left->m_child;
    if (left->m_child != nullptr)
        left->m_child->m_before = right;
    left->m_child = right;
    return left;
}

/// Joins heaps that are siblings into one: in pairs first, then the pairs from the last to the first, which is what
/// keeps the average low. Without recursion, for there may be thousands.
TYTimer* TYTimerQueue::MELD_ALL(TYTimer* siblings)
{
    TYTimer* pairs = nullptr; // the last first
    while (siblings != nullptr)
    {
        TYTimer* const left = siblings;
        TYTimer* const right = std::exchange(left->m_sibling, nullptr);
        siblings = right == nullptr ? nullptr : std::exchange(right->m_sibling, nullptr);
        TYTimer* const pair = MELD(left, right);
        pair->m_before = nullptr;
        pair->m_sibling = pairs;
        pairs = pair;
    }
    TYTimer* all = nullptr;
    while (pairs != nullptr)
    {
        TYTimer* const rest = std::exchange(pairs->m_sibling, nullptr);
        all = MELD(all, pairs);
        pairs = rest;
    }
    return all;
}

/// Takes a heap, which is not the topmost, out from below another.
void TYTimerQueue::CUT(TYTimer& timer)
{
    (timer.m_before->m_child == &timer ? timer.m_before->m_child : timer.m_before->m_sibling) = timer.m_sibling;
    if (timer.m_sibling != nullptr)
        timer.m_sibling->m_before = timer.m_before;
    timer.m_before = nullptr;
    timer.m_sibling = nullptr;
}
