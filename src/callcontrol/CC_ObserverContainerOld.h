#pragma once

#include "calls/CC_CountedObservers.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYLifeline.h"

/// The observers of a context, provider or endpoint (Owner); see CC_CountedObservers for the rules of registration and
/// delivery. Each notification goes through a static function of the owner that takes the observer, the owner and a
/// datum.
///
///     m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_DESTROY, *this, nullptr);
template <class Observer, class Owner>
class CC_ObserverContainerOld
{
public:
    /// `data` is what the notification passes on, as the owner says.
    using Trampoline = void (*)(Observer&, Owner&, void* data);

    /// OK, or NO_ELEMENT when memory is out.
    XCode addObserver(Observer& observer) { return m_observers.add(&observer); }
    /// Counts one registration less; an observer that was never added is ignored.
    void removeObserver(Observer const& observer) { m_observers.remove(&observer); }
    /// From now on nobody is told anything.
    void silence() { m_observers.silence(); }

    /// Ends with the container, and so with the owner.
    TYLifeline const& getLifeline() const { return m_lifeline; }

    /// The owner may end inside a notification; the walk then ends with it.
    void notifyObservers(Trampoline trampoline, Owner& owner, void* data) const
    {
        TYLifeline::Watch const self(m_lifeline);
        m_observers.forEachWhile([&] { return self.isAlive(); },
                                 [&](Observer& observer) { trampoline(observer, owner, data); });
    }

    /// Diagnostic dump; observers whose count has fallen to 0 are still numbered.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const
    {
        info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Observer Container", String::s_empty);
        info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Number Of Observers",
                       String::stringOf(m_observers.getNumberOfEntries()));
        return info;
    }

private:
    CC_CountedObservers<Observer, int, 2> m_observers;
    TYLifeline m_lifeline;
};
