#pragma once

#include "platform/base/TYSmallVector.h"
#include "platform/base/XCode.h"

/// A list of observers with a registration count each, in the order in which they first came: what every observer list
/// of call control is made of.
///
/// An entry is never taken out: at count 0 it keeps its place and is skipped. So an observer may be added or removed
/// inside a notification; one that is added is told in the same walk. Removing has no floor, on purpose: once more
/// removed than added, the count is not 0 and the observer is told again, so callers pair the two exactly.
///
/// It does not own the observers. `Count` is the type of the counts, `INLINE` the number of entries that need no
/// memory.
template <class Observer, class Count, unsigned int INLINE>
class CC_CountedObservers
{
public:
    /// An observer and how often it is registered.
    struct CountedObserver
    {
        /// The observer stays its owner's; at count 0 it is skipped. @{
        Observer* m_observer;
        Count m_count;
        /// @}
    };

    /// OK, or NO_ELEMENT when memory is out.
    XCode add(Observer* observer)
    {
        if (CountedObserver* const entry = find(observer))
        {
            ++entry->m_count;
            return XCode::OK;
        }
        return m_entries.append(CountedObserver{observer, 1});
    }

    /// An observer that was never added is ignored.
    void remove(Observer const* observer)
    {
        if (CountedObserver* const entry = find(observer))
            --entry->m_count;
    }

    /// From now on nobody is told anything.
    void silence()
    {
        for (unsigned int i = 0; i < m_entries.getSize(); ++i)
            m_entries[i].m_count = 0;
    }

    /// Calls `tell(observer)` for every entry whose count is not 0, those appended meanwhile included.
    /// REQUIRES: the list outlives the walk, as that of a call or leg does, which holds itself meanwhile. (Watching
    /// over the list would double the cost of telling one observer.)
    template <class Tell>
    void forEach(Tell&& tell) const
    {
        forEachWhile([] { return true; }, tell);
    }
    /// The same as long as `isAlive()`, which is asked before the list is looked at: it may end inside the walk.
    template <class IsAlive, class Tell>
    void forEachWhile(IsAlive&& isAlive, Tell&& tell) const
    {
        for (unsigned int i = 0; isAlive() && i < m_entries.getSize(); ++i)
            if (m_entries[i].m_count != 0)
                tell(*m_entries[i].m_observer);
    }

    /// Calls `visit(entry)` for every entry, those of count 0, too. An observer may have ended without being removed:
    /// who is not known to be alive must not be touched.
    template <class Visit>
    void forEachEntry(Visit&& visit) const
    {
        for (CountedObserver const& entry : m_entries)
            visit(entry);
    }

    /// The number of distinct observers ever added.
    unsigned int getNumberOfEntries() const { return m_entries.getSize(); }

private:
    CountedObserver* find(Observer const* observer)
    {
        for (unsigned int i = 0; i < m_entries.getSize(); ++i)
            if (m_entries[i].m_observer == observer)
                return &m_entries[i];
        return nullptr;
    }

    TYSmallVector<CountedObserver, INLINE> m_entries;
};
