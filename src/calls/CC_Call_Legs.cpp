// How legs enter, leave and change calls.
//
// A move tells three circles of observers: the old call's that the leg has left, the new call's that it has joined, the
// leg's that it was relinked. Any of them may drop or move the very leg, end either call, or join. What keeps it whole:
// - The outermost move of a leg holds the leg and both calls. A move of the same leg asked for inside it waits (`Move`,
//   on the outermost one's stack) and is made when it has ended; of several the last one counts. A call that ends or
//   was released takes part in none, also when it does so while the move waits.
// - The leg is in the new call's list from the start, but gets the new call's leg observers only after the news
//   (`m_observedBy`). Who is added to the call's in between is added to the leg at once and not again (`given`).
// - A call whose last live leg has left has itself looked at: nobody else would.
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg_Move.h"
#include "properties/CC_PropertyCallLegState.h"
#include "recorder/CC_RecordWriter.h"

#include <algorithm>
#include <tuple>

namespace
{
using Kind = CC_RecordFormat::Kind;

unsigned long long s_walks = 0; // of calls over their legs

void RECORD(Kind kind, CC_Call const& call, CC_CallLeg const& leg)
{
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(kind, call.getSerial(), leg.getSerial());
}

void RECORD_MOVE(CC_Call const* from, CC_Call const* to, CC_CallLeg const& leg)
{
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON();
        recorder != nullptr && from != nullptr && to != nullptr)
        recorder->addNumber(Kind::LEG_MOVED, to->getSerial(), leg.getSerial(), 0, from->getSerial());
}

template <class List, class Value>
bool CONTAINS(List const& list, Value const* value)
{
    return std::find(list.begin(), list.end(), value) != list.end();
}
} // namespace

XCode CC_Call::TRANSFER_CALL_LEG(CC_Call* to, CC_CallLeg& leg)
{
    if (to == leg.m_call && leg.m_move == nullptr)
        return XCode::OK;
    if (to != nullptr && to->isOver())
        return XCode::NO_ELEMENT;
    if (leg.m_move != nullptr)
    {
        Hold target(to);
        leg.m_move->target.swap(target);
        leg.m_move->isAskedAgain = true;
        return XCode::OK;
    }

    CC_CallLeg::Reference const keepLeg(leg);
    Hold target(to);
    XCode result = XCode::OK;
    for (bool isFirst = true;; isFirst = false)
    {
        CC_CallLeg::Move move(leg.m_call);
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
        if (to->isOver() || leg.m_isEnding || !to->m_callLegs.append(&leg).isOk())
            return XCode::NO_ELEMENT;
        leg.addReference(); // the new call's
        if (leg.isSeenActive())
            to->noticeState();
        RECORD(Kind::LEG_JOINED, *to, leg);
    }
    if (from != nullptr)
    {
        from->takeObserversFrom(leg);
        from->unlist(leg);
        if (leg.isSeenActive())
            from->noticeState();
        RECORD(Kind::LEG_LEFT, *from, leg);
        from->m_callObservers.broadcastEvent(CC_EvCallCallLegModified(*from, leg),
                                             &CC_CallObserver::onCallCallLegRemoved);
    }
    leg.setCall(to);
    if (to != nullptr)
    {
        to->m_callObservers.broadcastEvent(CC_EvCallCallLegModified(*to, leg), &CC_CallObserver::onCallCallLegAdded);
        to->giveObserversTo(leg);
    }
    RECORD_MOVE(from, to, leg);
    leg.m_observers.broadcastEvent(CC_EvCallLegCallRelinked(leg, to, from), &CC_CallLegObserver::onCallLegCallRelinked);
    if (from != nullptr)
    {
        leg.removeReference(); // the old call's
        from->deferIfAbandoned();
    }
    return XCode::OK;
}

void CC_Call::giveObserversTo(CC_CallLeg& leg)
{
    leg.m_observedBy = this;
    // when memory is out an observer beyond the usual ones misses this leg; the leg makes up for us
    m_callLegObservers.forEach(
        [&](CC_CallLegObserver& observer)
        {
            bool const isGiven = CONTAINS(leg.m_move->given, &observer);
            if (!isGiven && !leg.addCallLegObserver(&observer).isOk() && &observer == this)
                leg.m_isMissedByCall = true;
        });
}

/// One more observer of all legs, for this one. A leg that is still on its way in gets the others later, and this one
/// not again.
XCode CC_Call::addLegObserver(CC_CallLeg& leg, CC_CallLegObserver* observer)
{
    bool const isOnItsWay = leg.m_observedBy != this;
    if (isOnItsWay && !leg.m_move->given.append(observer).isOk())
        return XCode::NO_ELEMENT;
    XCode const result = leg.addCallLegObserver(observer);
    if (!result.isOk() && isOnItsWay)
        leg.m_move->given.remove(leg.m_move->given.getSize() - 1);
    return result;
}

void CC_Call::removeLegObserver(CC_CallLeg& leg, CC_CallLegObserver const* observer)
{
    if (leg.m_observedBy != this)
    {
        auto& given = leg.m_move->given;
        auto const* const found = std::find(given.begin(), given.end(), observer);
        if (found == given.end())
            return; // it has not got this one yet
        given.remove(static_cast<unsigned int>(found - given.begin()));
    }
    leg.removeCallLegObserver(observer);
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

bool CC_Call::isListed(CC_CallLeg const& leg) const { return CONTAINS(m_callLegs, &leg); }

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

/// Takes out each leg of which `isToGo(leg)`, in order, those that join meanwhile included, whatever the observers do
/// to the list. A leg that comes back stays, or an observer that always puts it back would keep us here for ever.
template <class IsToGo>
void CC_Call::takeOutCallLegs(IsToGo&& isToGo)
{
    unsigned long long const walk = ++s_walks;
    unsigned int left = MOST_MOVES;
    for (unsigned int i = 0; i < m_callLegs.getSize() && left > 0;)
    {
        CC_CallLeg* const leg = m_callLegs[i];
        CC_CallLeg* const next = getCallLeg(i + 1);
        if (leg->m_lastWalk < walk && isToGo(*leg)) // else taken out by this walk, or by one inside it, and back
        {
            --left;
            leg->m_lastWalk = walk;
            std::ignore = TRANSFER_CALL_LEG(nullptr, *leg); // needs no memory
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
    takeOutCallLegs([](CC_CallLeg const&) { return true; });
}

/// Takes out the released legs that nobody but the call holds. One that an adapter still holds stays until it is let
/// go.
void CC_Call::removeReleasedCallLegs()
{
    takeOutCallLegs(
        [](CC_CallLeg const& leg)
        { return leg.getState() == CC_PropertyCallLegState::RELEASED && leg.m_referenceCount.load() == 1; });
}

/// Takes legs out as long as there are any, those that come back included. Whether that came to an end.
bool CC_Call::removeAllCallLegs()
{
    Hold const self(this);
    for (unsigned int left = MOST_MOVES; CC_CallLeg* const leg = findCallLegAtRest(); --left)
    {
        if (left == 0)
            return false;
        removeCallLeg(*leg);
    }
    destroyParticipatingCallLegs(); // those on their move go when that has ended
    return true;
}

CC_CallLeg* CC_Call::findCallLegAtRest() const
{
    for (CC_CallLeg* const leg : m_callLegs)
        if (leg->m_move == nullptr)
            return leg;
    return nullptr;
}

/// A call without a live leg ends in its clean-up; who has left it does not ask for that.
void CC_Call::deferIfAbandoned()
{
    if (!isOver() && !m_isCleaningUp && !hasLiveCallLeg())
        defer();
}
