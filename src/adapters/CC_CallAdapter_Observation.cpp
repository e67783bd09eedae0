// What the adapter makes of the events of its call and legs: its views, its peer, and what the module is told.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"

#include <tuple>
#include <utility>

void CC_CallAdapter::onCallObservationEnded(CC_Event<CC_Call> const& event)
{
    auto const& ended = dynamic_cast<CC_EvCallObservationEnded const&>(event);
    if (ended.getSource() == m_observedCall)
        m_observedCall = nullptr; // nothing is left to unregister from
}

void CC_CallAdapter::onCallCallLegAdded(CC_Event<CC_Call> const& event)
{
    auto const& added = dynamic_cast<CC_EvCallCallLegModified const&>(event);
    if (m_ownCallLeg != nullptr && added.getSource() == m_ownCallLeg->getCall() && added.getCallLeg() != m_ownCallLeg)
        linkPeerCallLeg();
}

void CC_CallAdapter::onCallCallLegRemoved(CC_Event<CC_Call> const& event)
{
    auto const& removed = dynamic_cast<CC_EvCallCallLegModified const&>(event);
    if (m_ownCallLeg != nullptr && removed.getSource() == m_ownCallLeg->getCall() &&
        removed.getCallLeg() != m_ownCallLeg && removed.getCallLeg() == m_peerCallLeg)
        linkPeerCallLeg();
}

void CC_CallAdapter::onCallPropertyChanged(CC_Event<CC_Call> const& event)
{
    auto const& changed = dynamic_cast<CC_EvCallPropertyChanged const&>(event);
    if (m_ownCallLeg != nullptr && changed.getSource() == m_ownCallLeg->getCall())
        updateCall();
}

void CC_CallAdapter::onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event)
{
    std::ignore = dynamic_cast<CC_EvCallLegObservationEnded const&>(event);
}

void CC_CallAdapter::onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event)
{
    auto const& relinked = dynamic_cast<CC_EvCallLegCallRelinked const&>(event);
    if (m_ownCallLeg == nullptr || relinked.getSource() != m_ownCallLeg)
        return;
    unobserveCall();
    if (relinked.getNewCall() != nullptr)
    {
        updateCall();
        observeCall(*relinked.getNewCall());
    }
    linkPeerCallLeg();
}

void CC_CallAdapter::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    auto const& changed = dynamic_cast<CC_EvCallLegPropertyChanged const&>(event);
    if (m_ownCallLeg == nullptr)
        return;
    if (changed.getSource() == m_ownCallLeg)
        updateOwnCallLeg();
    else if (changed.getSource() == m_peerCallLeg)
        onPeerPropertyChanged(changed.getFlags());
    else
        onOtherPropertyChanged(*changed.getSource(), changed.getFlags());
}

void CC_CallAdapter::onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event)
{
    auto const& service = dynamic_cast<CC_EvCallLegSynchronousService const&>(event);
    if (m_ownCallLeg == nullptr || service.getSource() == m_ownCallLeg)
        return;
    if (m_observer != nullptr)
        m_observer->notifyPeerSynchronousService(*this, *service.getService());
    else
        notifyPeerSynchronousService(*service.getService());
}

/// A peer that falls below the state in which the module last saw it may have to make way for another leg.
void CC_CallAdapter::onPeerPropertyChanged(CC_Flags const& flags)
{
    if (flags.get(CC_PropertyId::STATE))
    {
        auto const* const lastSeen =
            dynamic_cast<CC_PropertyCallLegState const*>(m_peerProperties.get(CC_PropertyId::STATE));
        if ((lastSeen == nullptr || m_peerCallLeg->getActivityLevel() < lastSeen->getState()) && linkPeerCallLeg())
            return;
    }
    updatePeerCallLeg();
}

/// A leg that becomes more active than the peer as the module last saw it takes over.
void CC_CallAdapter::onOtherPropertyChanged(CC_CallLeg const& leg, CC_Flags const& flags)
{
    if (!flags.get(CC_PropertyId::STATE))
        return;
    auto const* const lastSeen =
        dynamic_cast<CC_PropertyCallLegState const*>(m_peerProperties.get(CC_PropertyId::STATE));
    if (lastSeen != nullptr && leg.getActivityLevel() > lastSeen->getState())
        linkPeerCallLeg();
}

void CC_CallAdapter::observeCall(CC_Call& call)
{
    m_observedCall = &call;
    // the first entries of a call's lists need no memory; beyond them, without memory, the module hears less. What was
    // refused must not be taken back: the count of an entry elsewhere would fall below 0
    m_isCallObserver = call.addCallObserver(this).isOk();
    m_isCallLegObserver = call.addCallLegObserver(this).isOk();
}

/// From the call with which we registered and no other, wherever the own leg is by now.
void CC_CallAdapter::unobserveCall()
{
    if (CC_Call* const call = std::exchange(m_observedCall, nullptr))
    {
        if (std::exchange(m_isCallLegObserver, false))
            call->removeCallLegObserver(this);
        if (std::exchange(m_isCallObserver, false))
            call->removeCallObserver(this);
    }
}

void CC_CallAdapter::updateOwnCallLeg()
{
    CC_PropertyFilterContainer const* const filters = getOutputFilters();
    if (filters == nullptr)
    {
        m_ownProperties = m_ownCallLeg->getProperties();
        return;
    }
    CC_PropertyContainer filtered(m_ownCallLeg->getProperties());
    if (filters->applyFilters(filtered).isOk())
        m_ownProperties = filtered;
}

void CC_CallAdapter::updatePeerCallLeg()
{
    if (m_peerCallLeg != nullptr)
        updateView(m_peerProperties, m_peerCallLeg->getProperties());
}

void CC_CallAdapter::updateCall()
{
    if (CC_Call const* const call = getCall())
        updateView(m_callProperties, call->getProperties());
}

/// Brings a view up to date with its source and marks the ids that differ.
void CC_CallAdapter::updateView(CC_PropertyContainer& view, CC_PropertyContainer const& source)
{
    CC_PropertyFilterContainer const* const filters = getOutputFilters();
    CC_PropertyContainer filtered;
    if (filters != nullptr)
    {
        filtered = source;
        if (filtered.getNumberOfProperties() != source.getNumberOfProperties())
            return; // memory is out: better the view of before than one that calls what is there gone
        std::ignore = filters->applyFilters(filtered); // what the filters leave is what the module sees
    }
    CC_PropertyContainer const& current = filters != nullptr ? filtered : source;
    for (CC_Property const& property : current)
    {
        CC_Property const* const seen = std::as_const(view).get(property.getId());
        if (seen != nullptr && property.isEqual(*seen))
            continue;
        std::ignore = view.set(property); // what memory refuses is not seen; the module still hears of the change
        mark(property.getId());
    }
    for (unsigned int i = 0; i < view.getNumberOfProperties();)
    {
        unsigned int const id = view.getByIndex(i)->getId();
        if (current.get(id) != nullptr)
        {
            ++i;
            continue;
        }
        view.removeByIndex(i);
        mark(id);
    }
}

void CC_CallAdapter::mark(unsigned int id)
{
    if (m_peerChangeEvent != nullptr)
        std::ignore = m_peerChangeEvent->setPeerPropertyChange(id); // without memory the module is not told
}

/// Chooses the peer among the other legs. Whether it changed, or there is none; the adapter may then be gone.
bool CC_CallAdapter::linkPeerCallLeg()
{
    CC_Call const* const call = getCall();
    CC_CallLeg* const chosen =
        call != nullptr ? call->getOtherMostActiveCallLeg(*m_ownCallLeg, m_peerCallLeg) : nullptr;
    if (chosen == nullptr)
    {
        unlinkPeerCallLeg();
        return true;
    }
    if (chosen == m_peerCallLeg)
        return false;
    Attempt const attempt(*this);
    chosen->addReference();
    if (CC_CallLeg* const previous = std::exchange(m_peerCallLeg, chosen))
        previous->removeReference();
    if (!attempt.isOver())
        updatePeerCallLeg();
    return true;
}

void CC_CallAdapter::unlinkPeerCallLeg()
{
    CC_CallLeg* const peer = std::exchange(m_peerCallLeg, nullptr);
    if (peer == nullptr)
        return;
    Attempt const attempt(*this);
    peer->removeReference();
    if (attempt.isOver())
        return;
    for (CC_Property const& property : std::as_const(m_peerProperties))
        mark(property.getId());
    m_peerProperties.clear();
}
