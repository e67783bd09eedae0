#pragma once

#include "properties/CC_Flags.h"
#include "properties/CC_PropertyContainer.h"

#include <tuple>
#include <utility>

/// A copy of somebody's properties that filters rework, time and again, and that is then written somewhere.
///
/// Each time the filters get it as if it were made anew, and whoever writes it looks at all of it; yet nearly all is
/// what it was the last time. So it is brought up to date by what has changed in the source since and by what filters
/// have had for writing, and besides these nothing can differ from where it was written to. Containers mark the
/// positions of what is stored or handed out for writing, and all of them when one is added or removed. What filters
/// have had once counts as changed ever after, so that a pointer which one of them has kept is no way round it, and
/// where one has given a property another id, the ids do not agree any more and all is looked at. That holds for
/// properties of our own classes; with a module's among them it is copied anew, and everything compared.
///
///     copy.bringUpToDate(leg.getProperties(), copy.marksOf(event.getFlags()));
///     filters.applyFilters(copy.getProperties());
///     view.followMarked(copy.getProperties(), copy.settle(), ...);
class CC_PropertyWorkingCopy
{
public:
    using Marks = CC_PropertyContainer::Marks;
    static constexpr Marks ALL = CC_PropertyContainer::ALL_MARKED;

    CC_PropertyContainer& getProperties() { return m_properties; }

    /// What may have changed in the container since this was asked last.
    static Marks TAKE_MARKS(CC_PropertyContainer& container) { return container.takeMarks(); }
    /// The marks of these ids in a source that this is in step with.
    Marks marksOf(CC_Flags const& ids) const
    {
        Marks marks = 0;
        auto const addMark = [&](unsigned int id)
        {
            Marks const mark = m_properties.findMark(id);
            marks = static_cast<Marks>(marks | mark);
            return mark != 0;
        };
        return ids.forEachSet(addMark) ? marks : ALL;
    }

    /// `changed`: what may have changed in the source since this was made a copy of it last; ALL if it never was.
    /// Whether memory sufficed is told by the number of properties.
    void bringUpToDate(CC_PropertyContainer const& source, Marks changed)
    {
        noteHandedOut();
        changed = static_cast<Marks>(changed | m_handedOut);
        bool const areOurs = m_properties.isSelfContained() && source.isSelfContained();
        if (areOurs && m_properties.takeMarked(source, changed))
            m_unsettled = static_cast<Marks>(m_unsettled | changed);
        else
            copyAnew(source, areOurs);
    }
    /// What may differ from where it was written to last, for who writes all of it there now.
    Marks settle()
    {
        noteHandedOut();
        return std::exchange(m_unsettled, Marks{0});
    }
    /// Whoever was given these to write has not settled them.
    void unsettle(Marks marks) { m_unsettled = static_cast<Marks>(m_unsettled | marks); }

private:
    /// `areOurs`: nobody is called meanwhile.
    [[gnu::noinline]] void copyAnew(CC_PropertyContainer const& source, bool areOurs)
    {
        m_unsettled = ALL;
        if (areOurs)
        {
            unsigned int const kept = m_properties.takeOver(source); // pointers to the others point nowhere
            m_handedOut = static_cast<Marks>(m_handedOut & (kept < 16 ? (1U << kept) - 1 : ALL));
        }
        else
            m_properties = source;
        std::ignore = m_properties.takeMarks();
    }
    void noteHandedOut()
    {
        m_handedOut = static_cast<Marks>(m_handedOut | m_properties.takeMarks());
        m_unsettled = static_cast<Marks>(m_unsettled | m_handedOut);
    }

    CC_PropertyContainer m_properties;
    Marks m_handedOut = 0; // to filters, ever
    Marks m_unsettled = ALL;
};
