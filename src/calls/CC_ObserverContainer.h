#pragma once

#include "calls/CC_CountedObservers.h"
#include "calls/CC_Event.h"

/// The observers of a call or call leg (Source); see CC_CountedObservers for the rules of registration and delivery.
///
///     m_observers.broadcastEvent(CC_EvCallLegPropertyChanged(*this, flags),
///     &CC_CallLegObserver::onCallLegPropertyChanged);
template <class Observer, class Source>
class CC_ObserverContainer
{
public:
    /// What the observer is told by.
    using Operation = void (Observer::*)(CC_Event<Source> const&);

    /// OK, or NO_ELEMENT when memory is out.
    XCode addObserver(Observer* observer) { return m_observers.add(observer); }
    /// Counts one registration less; an observer that was never added is ignored.
    void removeObserver(Observer const* observer) { m_observers.remove(observer); }
    /// From now on nobody is told anything.
    void silence() { m_observers.silence(); }

    /// Hands the event to `operation` of every observer whose count is not 0.
    void broadcastEvent(CC_Event<Source> const& event, Operation operation) const
    {
        m_observers.forEach([&](Observer& observer) { (observer.*operation)(event); });
    }
    /// Calls `tell(observer)` for every observer whose count is not 0.
    template <class Tell>
    void forEach(Tell&& tell) const
    {
        m_observers.forEach(tell);
    }
    /// As CC_CountedObservers::forEachEntry.
    template <class Visit>
    void forEachEntry(Visit&& visit) const
    {
        m_observers.forEachEntry(visit);
    }
    /// The number of distinct observers ever added.
    unsigned int getNumberOfEntries() const { return m_observers.getNumberOfEntries(); }

private:
    // the call, two adapters and a guest: an ordinary call needs no memory for its observers
    CC_CountedObservers<Observer, unsigned int, 4> m_observers;
};
