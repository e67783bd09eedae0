#pragma once

#include "properties/CC_Flags.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyKind.h"

#include <tuple>
#include <utility>

/// A copy of somebody's properties that follows them: what an adapter knows of a leg or call.
///
/// Once it has been compared with its source, what is told of the next change is all that can differ, besides what was
/// written to the view itself. So it looks at no more than that, as long as it hears of every change and the source
/// neither gains nor loses a property; otherwise at everything. Of a property change between two legs of twelve
/// properties this saves a third of the instructions, and most of the memory that is touched when many calls are up.
/// That holds for properties of our own classes; with a module's among them it looks at everything every time.
///
///     CC_PropertyView::Told const told{&event.getFlags(), leg.getNumberOfNotifications()};
///     m_peerView.follow(leg.getProperties(), told, [this](unsigned int id) { mark(id); });
class CC_EXPORT CC_PropertyView
{
public:
    /// What the source tells of a change.
    struct Told
    {
        CC_Flags const* ids = nullptr; ///< those that changed; null when any may have
        unsigned int number = 0;       ///< of the notification: the view has heard all if they come one after the other
    };

    /// The copy.
    CC_PropertyContainer const& getProperties() const { return m_properties; }
    /// Whether that notification of the source is the last that was heard, or looked at with everything else.
    bool hasHeard(unsigned int number) const { return m_lastHeard == number; }
    /// From now on it is a copy of somebody else's, and no business of those who are just storing something here and
    /// have called a module's class: they fail.
    void interrupt() const { m_properties.interrupt(); }
    /// The same, and empties the copy, which is in step with no source then.
    void clear();
    /// What may have changed since this was asked last.
    CC_PropertyContainer::Marks takeMarks() { return m_properties.takeMarks(); }

    /// Stores into the view alone, as the container's `set` does; the source may or may not follow. @{
    XCode write(CC_Property const& property);
    XCode write(CC_PropertyContainer const& properties);
    /// @}

    /// The same for the first properties, which are not copied. REQUIRES: the view is empty.
    void take(CC_PropertyContainer& properties) { m_properties.take(properties); }

    /// Whether what is told is just the one property that was written here and then to the source, so that the view is
    /// a copy of it already. REQUIRES: nobody has written to the source in between.
    bool hasWritten(CC_PropertyContainer const& source, Told const& told)
    {
        if (told.ids == nullptr || m_inStepWith != &source || told.number != m_lastHeard + 1 || m_written == NONE ||
            !source.isSelfContained() || !m_properties.isSelfContained())
            return false;
        m_lastHeard = told.number;
        m_written = NONE;
        return true;
    }

    /// Makes the view a copy of the source.
    void assign(CC_PropertyContainer const& source, Told const& told);
    /// The same for a copy that filters have worked on, in which at most the marked ones have changed since it was
    /// followed last.
    void assignMarked(CC_PropertyContainer const& copy, CC_PropertyContainer::Marks marks, unsigned int number);

    /// Takes over what differs from the source and calls `onDifference(id)` for each id that does, in the source's
    /// order, and after these for what the source no longer has. Properties that stay keep their place.
    template <class OnDifference>
    void follow(CC_PropertyContainer const& source, Told const& told, OnDifference&& onDifference)
    {
        auto const take = [&](CC_Property& former, CC_Property const& current)
        { return takeOne(former, current, onDifference); };
        if (!takeChanged(source, told, take) && !takeAll(source, told, take, onDifference))
            followCopy(source, onDifference);
    }
    /// The same for a copy that filters have worked on, in which at most the marked ones have changed since it was
    /// followed last.
    template <class OnDifference>
    void followMarked(CC_PropertyContainer const& copy, CC_PropertyContainer::Marks marks, unsigned int number,
                      OnDifference&& onDifference)
    {
        auto const take = [&](CC_Property& former, CC_Property const& current)
        { return takeOne(former, current, onDifference); };
        if (takeMarked(copy, marks, number, take))
            return;
        bool const areOurs = copy.isSelfContained() && m_properties.isSelfContained(); // else it may destroy us
        follow(copy, {nullptr, number}, onDifference);
        if (areOurs)
            stayInStepWith(copy);
    }

private:
    using Container = CC_PropertyContainer;
    static constexpr unsigned int NONE = CC_Flags::NONE;

    /// Whether all that can differ is known, in both, and was taken by `take(former, current)`.
    template <class Take>
    bool takeChanged(CC_PropertyContainer const& source, Told const& told, Take const& take)
    {
        if (told.ids == nullptr || m_inStepWith != &source || told.number != m_lastHeard + 1)
            return false;
        m_lastHeard = told.number;
        auto const takeOne = [&](unsigned int id)
        {
            CC_Property* const former = m_properties.find(id);
            CC_Property const* const current = source.find(id);
            return former != nullptr && current != nullptr && take(*former, *current);
        };
        if (!told.ids->forEachSet(takeOne))
            return false;
        m_properties.markAll();
        unsigned int const written = std::exchange(m_written, NONE);
        return written == NONE || told.ids->get(written) || takeOne(written);
    }

    /// Whether the view was written from the copy last, and those that can differ were taken by
    /// `take(former, current)`.
    template <class Take>
    bool takeMarked(Container const& copy, Container::Marks marks, unsigned int number, Take const& take)
    {
        if (m_inStepWith != &copy || marks == Container::ALL_MARKED || !areAlike(copy))
            return false;
        m_lastHeard = number;
        unsigned int written = std::exchange(m_written, NONE);
        auto const takeOne = [&](CC_Property& former, CC_Property const& current, unsigned int)
        {
            if (current.getId() == written)
                written = NONE;
            return take(former, current);
        };
        m_properties.mark(marks);
        if (!m_properties.forEachMarked(copy, marks, takeOne))
            return false;
        if (written == NONE)
            return true;
        Container::Marks const mark = m_properties.findMark(written);
        m_properties.mark(mark);
        return mark != 0 && m_properties.forEachMarked(copy, mark, takeOne);
    }

    /// Whether both are as many, and nobody is called when they are compared, assigned or ended.
    bool areAlike(Container const& copy) const
    {
        return copy.isSelfContained() && m_properties.isSelfContained() &&
               copy.getNumberOfProperties() == m_properties.getNumberOfProperties();
    }
    /// After all was taken from the copy: only as long as both have the same order can they be told apart by marks.
    void stayInStepWith(Container const& copy)
    {
        auto const isThere = [](CC_Property const&, CC_Property const&, unsigned int) { return true; };
        if (!areAlike(copy) || !m_properties.forEachMarked(copy, Container::ALL_MARKED, isThere))
            m_inStepWith = nullptr;
    }

    static bool ASSIGN_ONE(CC_Property& former, CC_Property const& current);

    /// Whether both are of our own classes, so that nothing but the value has changed by now.
    template <class OnDifference>
    bool takeOne(CC_Property& former, CC_Property const& current, OnDifference const& onDifference)
    {
        CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(former, current);
        if (kind == nullptr)
            return false;
        if (kind->isEqual(former, current))
            return true;
        if (!kind->isSelfContained)
            return false;
        if (!kind->assign(former, current))
            m_inStepWith = nullptr;
        onDifference(current.getId());
        return true;
    }

    /// Whether all were taken; otherwise one of a class that is not ours, or of another class than before, stopped it.
    template <class Take, class OnDifference>
    bool takeAll(CC_PropertyContainer const& source, Told const& told, Take const& take,
                 OnDifference const& onDifference)
    {
        m_properties.interruptFollowing(); // who follows later knows more
        m_inStepWith = &source;
        m_lastHeard = told.number;
        m_written = NONE;
        m_properties.markAll();
        unsigned int kept = 0;
        bool const isSelfContained = source.isSelfContained();
        bool const isFirst = m_properties.isEmpty(); // then nobody need be looked for
        Container::Met met;
        Container::Cursor formers(m_properties);
        for (CC_Property const& current : source)
        {
            unsigned int const id = current.getId();
            CC_Property* const former = isFirst && !met.meets(id) ? nullptr : formers.find(id);
            if (former != nullptr)
            {
                if (!take(*former, current))
                    return false;
                ++kept;
                continue;
            }
            if (!isSelfContained && CC_PropertyKind::OF(current) == nullptr)
                return false;
            if (isSelfContained ? m_properties.appendCopy(current) : m_properties.replace(nullptr, current).isOk())
                ++kept;
            else
                m_inStepWith = nullptr; // without memory it is not seen; that it differs is told all the same
            onDifference(current.getId());
        }
        if (kept < m_properties.getNumberOfProperties())
            removeWhatIsGone(source, onDifference);
        return true;
    }

    /// A module's class may do anything when it is cloned, compared, assigned or ended, to this view as well as to the
    /// source, destroying it included. So the source is copied first and nothing that was found in the view is relied
    /// on after a call; and what the class does not compare may differ unnoticed, so there is no step to be in.
    /// REQUIRES: the source outlives this.
    template <class OnDifference>
    [[gnu::noinline]] void followCopy(CC_PropertyContainer const& source, OnDifference const& onDifference)
    {
        m_inStepWith = nullptr;
        CC_PropertyContainer::Following const self(m_properties);
        CC_PropertyContainer copy;
        copy = source;
        if (!self.isAlive() || !hasAllOfOwnKinds(copy, source))
            return; // memory is out: better the view of before than one that calls what is there gone
        for (CC_Property const& current : copy)
        {
            CC_Property const* const former = m_properties.get(current.getId());
            bool const isSame = former != nullptr && current.isEqual(*former);
            if (!self.isAlive())
                return;
            if (isSame)
                continue;
            onDifference(current.getId()); // first: who follows inside the assignment finds no difference any more
            std::ignore = m_properties.set(current, self); // what memory refuses differs the next time as well
            if (!self.isAlive())
                return;
        }
        removeWhatIsGone(copy, onDifference);
    }

    template <class OnDifference>
    [[gnu::noinline]] void removeWhatIsGone(CC_PropertyContainer const& source, OnDifference const& onDifference)
    {
        CC_PropertyContainer::Following const self(m_properties); // an ending property may destroy us
        unsigned int i = 0;
        while (CC_Property const* const former = self.isAlive() ? m_properties.getByIndex(i) : nullptr)
        {
            unsigned int const id = former->getId();
            if (source.get(id) != nullptr)
            {
                ++i;
                continue;
            }
            onDifference(id);
            m_properties.removeByIndex(i);
        }
    }

    void assignCopy(CC_PropertyContainer const& source);
    static bool hasAllOfOwnKinds(CC_PropertyContainer const& copy, CC_PropertyContainer const& source);

    CC_PropertyContainer m_properties;
    CC_PropertyContainer const* m_inStepWith = nullptr; // null, or not the source: everything may differ
    unsigned int m_lastHeard = 0;                       // the number of the notification heard last
    unsigned int m_written = NONE;                      // what was written here since
};
