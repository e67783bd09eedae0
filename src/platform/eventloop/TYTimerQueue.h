#pragma once

#include "platform/base/Export.h"

class TYTimer;

/// The timers of a loop that wait, the next due first; those due at one moment in the order of their starts.
///
/// For TYEventLoop. A pairing heap whose links are inside the timers: it owns nothing and needs no memory, adding takes
/// constant time, taking one out O(log n) on average over any sequence of operations.
class CC_EXPORT TYTimerQueue
{
public:
    TYTimerQueue() = default;
    TYTimerQueue(TYTimerQueue const&) = delete;
    TYTimerQueue& operator=(TYTimerQueue const&) = delete;

    /// Whether no timer waits.
    bool isEmpty() const { return m_first == nullptr; }
    /// The timer that is due next; null when none waits.
    TYTimer* getFirst() const { return m_first; }
    /// REQUIRES: the timer is not in the queue, and its due time is set.
    void add(TYTimer& timer);
    /// REQUIRES: the timer is in the queue.
    void remove(TYTimer& timer);

private:
    static bool IS_BEFORE(TYTimer const& left, TYTimer const& right);
    static TYTimer* MELD(TYTimer* left, TYTimer* right);
    static TYTimer* MELD_ALL(TYTimer* siblings);
    static void CUT(TYTimer& timer);

    TYTimer* m_first = nullptr;
    unsigned long long m_starts = 0;
};
