#pragma once

#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "adapters/CC_CallAdapter_Kept.h"

#include <memory>
#include <new>
#include <utility>

/// The copy of a leg's, call's or view's properties that filters work on.
///
/// It is nobody else's while it lives: who needs a copy meanwhile makes another one, and it stays when a filter
/// destroys the adapter. At its end it is kept, if the attempt still goes on and nothing in it is a module's or the
/// media layer's, who may wait for the end of what is theirs.
///
///     Copy const copy(attempt, *this, Kept::PEER_OUTPUT, leg.getProperties());
///     if (copy.isWhole() && filters->applyFilters(copy.get()).isOk())
///         ...
class CC_CallAdapter::Copy
{
public:
    /// The attempt must outlive the copy.
    Copy(Attempt const& attempt, CC_CallAdapter& adapter, Kept::Use use, CC_PropertyContainer const& source)
        : m_attempt(attempt), m_adapter(adapter), m_use(use), m_container(TAKE(adapter, use))
    {
        if (m_container == nullptr)
            return;
        m_container->properties = source; // which a module's class may use to destroy the adapter and the source
        m_isWhole =
            !attempt.isOver() && m_container->properties.getNumberOfProperties() == source.getNumberOfProperties();
    }
    ~Copy()
    {
        if (m_container == nullptr || !m_container->properties.isSelfContained() || m_attempt.isOver())
            return;
        if (Kept* const kept = KEPT(m_adapter))
            kept->containers[m_use] = std::move(m_container);
    }
    Copy(Copy const&) = delete;
    Copy& operator=(Copy const&) = delete;

    /// Otherwise memory is out, or a module's class has ended the attempt when it was copied.
    bool isWhole() const { return m_isWhole; }
    /// REQUIRES: isWhole()
    CC_PropertyContainer& get() const { return m_container->properties; }

private:
    using Container = Kept::Container;

    /// Null when memory is out.
    static std::unique_ptr<Container> TAKE(CC_CallAdapter& adapter, Kept::Use use)
    {
        if (Kept* const kept = KEPT(adapter); kept != nullptr && kept->containers[use] != nullptr)
            return std::move(kept->containers[use]);
        return std::unique_ptr<Container>(new (std::nothrow) Container);
    }
    /// Null without an attempt, and when memory is out.
    static Kept* KEPT(CC_CallAdapter& adapter)
    {
        return adapter.m_peerChangeEvent != nullptr ? adapter.m_peerChangeEvent->getKept() : nullptr;
    }

    Attempt const& m_attempt;
    CC_CallAdapter& m_adapter;
    Kept::Use m_use;
    std::unique_ptr<Container> m_container;
    bool m_isWhole = false;
};
