// What the adapter makes of the events of its call and legs: its views, its peer, and what the module is told.
//
// A view must neither show what is not there nor miss what is. Three things could make it: an output filter that drops
// or destroys the adapter, or brings about a later refresh, while its copy is being filtered (then the copy is thrown
// away); a change told inside the news of another one, so that the second arrives when it is no news any more; and a
// leg whose changes we do not hear yet. For the last two the peer is looked at again before the module is told
// (`catchUp`), which costs a comparison of two numbers when nothing was missed.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Copy.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "recorder/CC_RecordWriter.h"
#include "services/CC_Service.h"

#include <tuple>
#include <typeinfo>
#include <utility>

void CC_CallAdapter::onCallObservationEnded(CC_Event<CC_Call> const& event)
{
    auto const& ended = CC_EvCallObservationEnded::FROM(event);
    if (ended.getSource() == m_observedCall)
        m_observedCall = nullptr; // nothing is left to unregister from
}

void CC_CallAdapter::onCallCallLegAdded(CC_Event<CC_Call> const& event)
{
    auto const& added = CC_EvCallCallLegModified::FROM(event);
    if (m_ownCallLeg != nullptr && added.getSource() == m_ownCallLeg->getCall() && added.getCallLeg() != m_ownCallLeg)
        linkPeerCallLeg();
}

void CC_CallAdapter::onCallCallLegRemoved(CC_Event<CC_Call> const& event)
{
    auto const& removed = CC_EvCallCallLegModified::FROM(event);
    if (m_ownCallLeg != nullptr && removed.getSource() == m_ownCallLeg->getCall() &&
        removed.getCallLeg() != m_ownCallLeg && removed.getCallLeg() == m_peerCallLeg)
        linkPeerCallLeg();
}

void CC_CallAdapter::onCallPropertyChanged(CC_Event<CC_Call> const& event)
{
    auto const& changed = CC_EvCallPropertyChanged::FROM(event);
    if (m_ownCallLeg != nullptr && changed.getSource() == m_ownCallLeg->getCall())
        updateCall();
}

void CC_CallAdapter::onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event)
{
    std::ignore = CC_EvCallLegObservationEnded::FROM(event);
}

void CC_CallAdapter::onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event)
{
    auto const& relinked = CC_EvCallLegCallRelinked::FROM(event);
    if (m_ownCallLeg == nullptr)
        return;
    if (relinked.getSource() != m_ownCallLeg)
        return onOtherRelinked(*relinked.getSource());
    Attempt const attempt(*this);
    unobserveCall();
    if (relinked.getNewCall() != nullptr)
    {
        m_callView.interrupt();
        unsigned int const told = CC_Call::GET_NUMBER_OF_CHANGES();
        updateCall();
        if (attempt.isOver())
            return;
        observeCall(*relinked.getNewCall());
        if (told != CC_Call::GET_NUMBER_OF_CHANGES())
            updateCall(); // what filters and properties wrote to it meanwhile was not told us
        if (attempt.isOver())
            return;
    }
    linkPeerCallLeg();
}

/// From now on we hear of a leg that has joined. It may have risen above the peer since we were told that it comes.
void CC_CallAdapter::onOtherRelinked(CC_CallLeg const& leg)
{
    bool const isMissed = &leg != m_peerCallLeg && leg.getCall() != nullptr && leg.getCall() == getCall() &&
                          (m_peerCallLeg == nullptr || leg.getActivityLevel() > m_peerCallLeg->getActivityLevel());
    if (isMissed)
        linkPeerCallLeg();
}

void CC_CallAdapter::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    auto const& changed = CC_EvCallLegPropertyChanged::FROM(event);
    if (m_ownCallLeg == nullptr)
        return;
    if (changed.getSource() == m_ownCallLeg)
        updateOwnCallLeg(changed.getFlags());
    else if (changed.getSource() == m_peerCallLeg)
        onPeerPropertyChanged(changed.getFlags());
    else
        onOtherPropertyChanged(*changed.getSource(), changed.getFlags());
}

void CC_CallAdapter::onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event)
{
    auto const& service = CC_EvCallLegSynchronousService::FROM(event);
    if (m_ownCallLeg == nullptr || service.getSource() == m_ownCallLeg)
        return;
    CC_Service& asked = *service.getService();
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->addNumber(CC_RecordFormat::Kind::SERVICE_TOLD, getCallSerial(), getLegSerial(), 0,
                            service.getSource()->getSerial(), typeid(asked).name());
    if (m_observer != nullptr)
        m_observer->notifyPeerSynchronousService(*this, asked);
    else
        notifyPeerSynchronousService(asked);
}

/// A peer that falls below the state in which the module last saw it may have to make way for another leg.
void CC_CallAdapter::onPeerPropertyChanged(CC_Flags const& flags)
{
    if (flags.get(CC_PropertyId::STATE))
    {
        auto const* const lastSeen =
            CC_PropertyCallLegState::FROM(m_peerView.getProperties().get(CC_PropertyId::STATE));
        if ((lastSeen == nullptr || m_peerCallLeg->getActivityLevel() < lastSeen->getState()) && linkPeerCallLeg())
            return;
    }
    updatePeerCallLeg(&flags);
}

/// A leg that becomes more active than the peer as the module last saw it takes over.
void CC_CallAdapter::onOtherPropertyChanged(CC_CallLeg const& leg, CC_Flags const& flags)
{
    if (!flags.get(CC_PropertyId::STATE))
        return;
    auto const* const lastSeen = CC_PropertyCallLegState::FROM(m_peerView.getProperties().get(CC_PropertyId::STATE));
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

namespace
{
/// `changed`: the ids of which the leg tells; null when it is not telling.
CC_PropertyView::Told TOLD(CC_CallLeg const& leg, CC_Flags const* changed)
{
    return {leg.mayChangeUntold() || !leg.isTellingTheLast() ? nullptr : changed, leg.getNumberOfNotifications()};
}
} // namespace

void CC_CallAdapter::updateOwnCallLeg(CC_Flags const& changed)
{
    CC_CallLeg const& leg = *m_ownCallLeg;
    CC_PropertyFilterContainer const* const filters = getOutputFilters();
    if (filters == nullptr)
    {
        CC_PropertyView::Told const told = TOLD(leg, &changed);
        if (std::exchange(m_isWritingOwn, false) && m_ownView.hasWritten(leg.getProperties(), told))
            return;
        return m_ownView.assign(leg.getProperties(), told);
    }
    filterOwnCallLeg(changed, *filters);
}

/// Apart, so that a call without filters does not pay for it.
__attribute__((noinline)) void CC_CallAdapter::filterOwnCallLeg(CC_Flags const& changed,
                                                                CC_PropertyFilterContainer const& filters)
{
    Attempt const attempt(*this);
    unsigned int const refresh = ++m_refreshes;
    CC_CallLeg const& leg = *m_ownCallLeg;
    Copy const copy(attempt, *this, Kept::OWN_OUTPUT, leg.getProperties(), leg.getSerial(), TOLD(leg, &changed));
    if (!copy.isWhole())
        return;
    XCode const result = filters.applyFilters(copy.get());
    if (result.isOk() && !attempt.isOver() && refresh == m_refreshes)
        m_ownView.assignMarked(copy.get(), copy.settle(), 0);
}

/// Tells the module. One class for the views of peer and call, so that what follows them is there once.
class CC_CallAdapter::OnDifference
{
public:
    /// `changed`: the ids of which the peer tells; null when it is another, and for the call.
    OnDifference(CC_CallAdapter& adapter, CC_Flags const* changed) : m_adapter(adapter), m_changed(changed) {}

    void operator()(unsigned int id) const
    {
        if (id == CC_PropertyId::STATE && m_changed != nullptr && !m_changed->get(id))
            m_adapter.m_isPeerToBeChosen = true; // when the state itself is told, its fall does not show any more
        m_adapter.mark(id);
    }

private:
    CC_CallAdapter& m_adapter;
    CC_Flags const* m_changed;
};

/// Brings a view up to date with its source and tells the ids that differ. When a filter brings about another refresh,
/// that one is the later.
[[gnu::always_inline]] inline void CC_CallAdapter::updateView(CC_PropertyView& view, CC_PropertyContainer const& source,
                                                              unsigned long long serial,
                                                              CC_PropertyView::Told const& told,
                                                              OnDifference const& onDifference)
{
    CC_PropertyFilterContainer const* const filters = getOutputFilters();
    if (filters == nullptr)
        return view.follow(source, told, onDifference);
    filterView(view, source, serial, told, onDifference, *filters);
}

/// `changed`: the ids of which the peer tells; null when the peer is another.
void CC_CallAdapter::updatePeerCallLeg(CC_Flags const* changed)
{
    if (m_peerCallLeg == nullptr)
        return;
    CC_CallLeg::Reference const keepPeer(*m_peerCallLeg);
    updateView(m_peerView, m_peerCallLeg->getProperties(), m_peerCallLeg->getSerial(), TOLD(*m_peerCallLeg, changed),
               {*this, changed});
}

void CC_CallAdapter::updateCall()
{
    if (CC_Call const* const call = getCall())
        updateView(m_callView, call->getProperties(), 0, {}, {*this, nullptr});
}

/// Apart, so that a call without filters does not pay for it.
__attribute__((noinline)) void CC_CallAdapter::filterView(CC_PropertyView& view, CC_PropertyContainer const& source,
                                                          unsigned long long serial, CC_PropertyView::Told const& told,
                                                          OnDifference const& onDifference,
                                                          CC_PropertyFilterContainer const& filters)
{
    Attempt const attempt(*this);
    unsigned int const refresh = ++m_refreshes;
    Copy const copy(attempt, *this, &view == &m_peerView ? Kept::PEER_OUTPUT : Kept::CALL_OUTPUT, source, serial, told);
    if (!copy.isWhole())
        return; // memory is out: better the view of before than one that calls what is there gone
    std::ignore = filters.applyFilters(copy.get()); // what the filters leave is what the module sees
    if (!attempt.isOver() && refresh == m_refreshes)
        view.followMarked(copy.get(), copy.settle(), told.number, onDifference);
}

void CC_CallAdapter::mark(unsigned int id)
{
    if (m_peerChangeEvent != nullptr)
        std::ignore = m_peerChangeEvent->setPeerPropertyChange(id); // without memory the module is not told
}

/// Before the module is told: the peer whose fall did not show, or whose news did not all reach us, is chosen and
/// looked at anew. A leg that joins is our peer before it has us for an observer; what it changes until then is such
/// news.
void CC_CallAdapter::catchUp()
{
    m_isPeerToBeChosen = false;
    if (!linkPeerCallLeg() && hasToCatchUp())
        updatePeerCallLeg(nullptr);
}

bool CC_CallAdapter::hasToCatchUp() const
{
    return m_peerCallLeg != nullptr &&
           (m_isPeerToBeChosen || !m_peerView.hasHeard(m_peerCallLeg->getNumberOfNotifications()));
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
    m_peerView.interrupt();
    if (CC_CallLeg* const previous = std::exchange(m_peerCallLeg, chosen))
        GIVE_UP(*previous);
    if (!attempt.isOver())
        updatePeerCallLeg(nullptr);
    bool const isOnItsWay = !attempt.isOver() && m_peerCallLeg != nullptr && m_peerCallLeg->m_move != nullptr;
    if (isOnItsWay && m_peerChangeEvent != nullptr)
        std::ignore = m_peerChangeEvent->setIfNotPending(); // to catch up, also where it looked like the former one
    return true;
}

void CC_CallAdapter::unlinkPeerCallLeg()
{
    CC_CallLeg* const peer = std::exchange(m_peerCallLeg, nullptr);
    if (peer == nullptr)
        return;
    Attempt const attempt(*this);
    GIVE_UP(*peer);
    if (attempt.isOver())
        return;
    for (CC_Property const& property : m_peerView.getProperties())
        mark(property.getId());
    m_peerView.clear();
}
