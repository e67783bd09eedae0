// How legs enter, leave and change calls.
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyCallLegState.h"

#include <tuple>

namespace
{
unsigned long long s_walks = 0; // of calls over their legs
} // namespace

/// A leg's move between calls, while it is under way; on the stack of the outermost one.
struct CC_CallLeg::Move
{
    CC_Call::Hold target; // of the move that was asked for meanwhile
    bool isAskedAgain = false;
};

XCode CC_Call::TRANSFER_CALL_LEG(CC_Call* to, CC_CallLeg& leg)
{
    if (leg.m_move != nullptr)
    {
        Hold target(to);
        leg.m_move->target.swap(target);
        leg.m_move->isAskedAgain = true;
        return XCode::OK;
    }
    if (to == leg.m_call)
        return XCode::OK;

    CC_CallLeg::Reference const keepLeg(leg);
    Hold target(to);
    XCode result = XCode::OK;
    for (bool isFirst = true;; isFirst = false)
    {
        Hold const source(leg.m_call);
        CC_CallLeg::Move move;
        leg.m_move = &move;
        XCode const moved = MOVE(target.get(), leg);
        leg.m_move = nullptr;
        if (isFirst)
            result = moved;
        if (!move.isAskedAgain)
            return result;
        target.swap(move.target);
    }
}

/// The move itself. The caller holds both calls and the leg.
XCode CC_Call::MOVE(CC_Call* to, CC_CallLeg& leg)
{
    CC_Call* const from = leg.m_call;
    if (to == from)
        return XCode::OK;
    if (to != nullptr)
    {
        if (to->m_isEnding || leg.m_isEnding || !to->m_callLegs.append(&leg).isOk())
            return XCode::NO_ELEMENT;
        leg.addReference(); // the new call's
    }
    if (from != nullptr)
    {
        from->takeObserversFrom(leg);
        from->unlist(leg);
        from->m_callObservers.broadcastEvent(CC_EvCallCallLegModified(*from, leg),
                                             &CC_CallObserver::onCallCallLegRemoved);
    }
    leg.setCall(to);
    if (to != nullptr)
    {
        to->m_callObservers.broadcastEvent(CC_EvCallCallLegModified(*to, leg), &CC_CallObserver::onCallCallLegAdded);
        to->giveObserversTo(leg);
    }
    leg.m_observers.broadcastEvent(CC_EvCallLegCallRelinked(leg, to, from), &CC_CallLegObserver::onCallLegCallRelinked);
    if (from != nullptr)
        leg.removeReference(); // the old call's
    return XCode::OK;
}

void CC_Call::giveObserversTo(CC_CallLeg& leg)
{
    leg.m_observedBy = this;
    // when memory is out an observer beyond the usual ones misses this leg; the leg makes up for us
    m_callLegObservers.forEach(
        [&](CC_CallLegObserver& observer)
        {
            if (!leg.addCallLegObserver(&observer).isOk() && &observer == this)
                leg.m_isMissedByCall = true;
        });
}

void CC_Call::takeObserversFrom(CC_CallLeg& leg)
{
    leg.m_observedBy = nullptr;
    leg.m_isMissedByCall = false;
    m_callLegObservers.forEach([&](CC_CallLegObserver& observer) { leg.removeCallLegObserver(&observer); });
}

void CC_Call::unlist(CC_CallLeg const& leg)
{
    for (unsigned int i = m_callLegs.getSize(); i-- > 0;)
        if (m_callLegs[i] == &leg)
            m_callLegs.remove(i);
}

bool CC_Call::isListed(CC_CallLeg const& leg) const
{
    for (CC_CallLeg const* const other : m_callLegs)
        if (other == &leg)
            return true;
    return false;
}

XCode CC_Call::addCallLeg(CC_CallLeg& leg)
{
    Hold const self(this);
    if (!TRANSFER_CALL_LEG(this, leg).isOk())
        return XCode::FAILURE;
    defer();
    return XCode::OK;
}

void CC_Call::removeCallLeg(CC_CallLeg& leg)
{
    Hold const self(this);
    std::ignore = TRANSFER_CALL_LEG(nullptr, leg); // into no call: needs no memory
    defer();
}

/// Calls `handle(leg)` once for each leg in order, those that join meanwhile included, whatever it and the observers
/// behind it do to the list. A leg that comes back is not handled again, or an observer that always puts it back would
/// keep us here for ever.
template <class Handle>
void CC_Call::forEachCallLeg(Handle&& handle)
{
    unsigned long long const walk = ++s_walks;
    for (unsigned int i = 0; i < m_callLegs.getSize();)
    {
        CC_CallLeg* const leg = m_callLegs[i];
        CC_CallLeg* const next = getCallLeg(i + 1);
        if (leg->m_lastWalk < walk) // else by this walk, or by one inside it
        {
            leg->m_lastWalk = walk;
            handle(*leg);
        }
        if (getCallLeg(i) == leg)
            ++i;
        else if (getCallLeg(i) != next)
            i = 0; // more than this leg has gone: begin again
    }
}

void CC_Call::destroyParticipatingCallLegs()
{
    Hold const self(this);
    forEachCallLeg([](CC_CallLeg& leg) { std::ignore = TRANSFER_CALL_LEG(nullptr, leg); }); // needs no memory
}

/// Takes out the released legs that nobody but the call holds. One that an adapter still holds stays until it is let
/// go.
void CC_Call::removeReleasedCallLegs()
{
    forEachCallLeg(
        [](CC_CallLeg& leg)
        {
            if (leg.getState() == CC_PropertyCallLegState::RELEASED && leg.m_referenceCount.load() == 1)
                std::ignore = TRANSFER_CALL_LEG(nullptr, leg); // needs no memory
        });
}
