#pragma once

#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "adapters/CC_CallAdapter_Kept.h"
#include "calls/CC_CallLeg.h"

#include <memory>
#include <new>
#include <tuple>
#include <utility>

/// The copy of a leg's, call's or view's properties that filters work on.
///
/// It is nobody else's while it lives: who needs a copy meanwhile makes another one, and it stays when a filter
/// destroys the adapter. At its end it is kept, if the attempt still goes on, nobody has kept a later one, and nothing
/// in it is a module's or the media layer's, who may wait for the end of what is theirs.
///
/// A kept one is brought up to date and written by what can have changed (CC_PropertyWorkingCopy). Who can change what,
/// and how it is noticed:
/// - A view is the adapter's; modules see it constant. It marks what is stored in it, and the marks are taken by the
///   copy that was made last, so one that was made before, in which a filter has brought about another, is none the
///   wiser and copies everything.
/// - A leg tells what changes, and numbers its tellings; whoever missed one copies everything. Nothing may change
///   untold unless somebody has had its properties for writing, which holds for good (`mayChangeUntold`), and how long
///   they keep pointers into them does not matter then. Legs are told apart by their serial numbers, since one may come
///   to the address of another.
/// - The copy itself is changed by filters alone, and what they have had for writing is never again taken for
/// unchanged.
/// - Where it is written to: the view of the peer or the own leg knows whether it was written from this copy last and
///   what the module has written there since; a leg is the one it was if it has told nothing since. A property that was
///   not equal when it was compared is compared again, so one that the leg refuses, or keeps of another class, is
///   refused or told again.
///
///     Copy const copy(attempt, *this, Kept::PEER_OUTPUT, leg.getProperties(), leg.getSerial(), told);
///     if (copy.isWhole() && filters->applyFilters(copy.get()).isOk())
///         ...
class CC_CallAdapter::Copy
{
    using Container = Kept::Container;

public:
    /// Of a view, for the input filters. The attempt must outlive the copy.
    Copy(Attempt const& attempt, CC_CallAdapter& adapter, Kept::Use use, CC_PropertyView& view)
        : Copy(attempt, adapter, use)
    {
        if (m_container == nullptr)
            return;
        bool const isInStep = isLatest() && m_container->source == &view.getProperties();
        Container::Marks const changed = view.takeMarks();
        copy(view.getProperties(), isInStep ? changed : Container::ALL);
    }
    /// Of a leg's properties, or of a call's, which has the serial number 0. `told`: by the leg.
    Copy(Attempt const& attempt, CC_CallAdapter& adapter, Kept::Use use, CC_PropertyContainer const& source,
         unsigned long long serial, CC_PropertyView::Told const& told)
        : Copy(attempt, adapter, use)
    {
        if (m_container == nullptr)
            return;
        Container& ours = *m_container;
        bool const isInStep = told.ids != nullptr && ours.source == &source && ours.sourceSerial == serial &&
                              ours.sourceNumber + 1 == told.number;
        ours.sourceSerial = serial;
        ours.sourceNumber = told.number;
        copy(source, isInStep ? ours.marksOf(*told.ids) : Container::ALL);
    }
    ~Copy()
    {
        if (m_container == nullptr || !get().isSelfContained() || m_attempt.isOver() || m_kept == nullptr)
            return;
        if (m_kept->containers[m_use] == nullptr) // otherwise it is a later one
            m_kept->containers[m_use] = std::move(m_container);
    }
    Copy(Copy const&) = delete;
    Copy& operator=(Copy const&) = delete;

    /// Otherwise memory is out, or a module's class has ended the attempt when it was copied.
    bool isWhole() const { return m_isWhole; }
    /// REQUIRES: isWhole()
    CC_PropertyContainer& get() const { return m_container->getProperties(); }

    /// What may differ from the view that was written from this copy last, for who writes it there now.
    Container::Marks settle() const { return m_container->settle(); }
    /// Writes the properties to the leg, as its `setProperties`.
    XCode writeTo(CC_CallLeg& leg) const
    {
        Container& ours = *m_container;
        unsigned long long const serial = leg.getSerial();
        unsigned int const number = leg.getNumberOfNotifications();
        Container::Marks marks = ours.settle();
        if (ours.targetSerial != serial || ours.targetNumber != number || leg.mayChangeUntold())
            marks = Container::ALL;
        XCode const result = leg.setMarked(get(), marks);
        ours.unsettle(marks);
        ours.targetSerial = result.isOk() ? serial : 0;
        ours.targetNumber = number + 1;
        return result;
    }

private:
    Copy(Attempt const& attempt, CC_CallAdapter& adapter, Kept::Use use)
        : m_attempt(attempt)
        , m_kept(adapter.m_peerChangeEvent != nullptr ? adapter.m_peerChangeEvent->getKept() : nullptr)
        , m_use(use)
    {
        if (m_kept != nullptr && m_kept->containers[use] != nullptr)
            m_container = std::move(m_kept->containers[use]);
        else
            m_container.reset(new (std::nothrow) Container);
    }

    /// `changed`: in the source since it was copied last; all if that was not the last copy of this container.
    void copy(CC_PropertyContainer const& source, Container::Marks changed)
    {
        Container& ours = *m_container;
        ours.source = nullptr;
        ours.bringUpToDate(source, changed); // a module's class may use it to destroy the adapter and the source
        m_isWhole = !m_attempt.isOver() && get().getNumberOfProperties() == source.getNumberOfProperties();
        if (m_isWhole)
            ours.source = &source;
    }

    /// Whether no other container has had the source's marks since ours had them; from now on ours is the latest.
    bool isLatest()
    {
        return m_kept != nullptr && std::exchange(m_kept->latest[m_use], m_container.get()) == m_container.get();
    }

    Attempt const& m_attempt;
    Kept* m_kept; // null when memory is out; the attempt's
    Kept::Use m_use;
    std::unique_ptr<Container> m_container; // null when memory is out
    bool m_isWhole = false;
};
