// How the own leg ends, and how legs are moved between calls: drop and transfer.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "adapters/CC_CallAdapter_Log.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "recorder/CC_RecordWriter.h"

#include <tuple>
#include <utility>

namespace
{
bool IS_RELEASED(CC_CallLeg const& leg) { return leg.getState() == CC_PropertyCallLegState::RELEASED; }
} // namespace

void CC_CallAdapter::logDrop() const
{
    if (Log const log(*this, RTD::LEVEL_FLOW); log.isWanted() && getCall() != nullptr)
        log->debug("[EP %s/%s] Drop call %s", log.getEndpointName(), m_name.c_str(), getCall()->getName().c_str());
}

void CC_CallAdapter::drop(QCause cause, unsigned int causeValue)
{
    TYLifeline::Watch const self(m_lifeline);
    if (getCall() != nullptr)
        logDrop();
    if (self.isAlive())
        dropOwnCallLeg(cause, causeValue);
}

void CC_CallAdapter::dropOwnCallLeg(QCause cause, unsigned int causeValue)
{
    if (m_ownCallLeg == nullptr)
        return;
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->addNumber(CC_RecordFormat::Kind::DROPPED, getCallSerial(), getLegSerial(),
                            static_cast<unsigned int>(cause), causeValue);
    unobserveCall();
    if (std::exchange(m_observesOwnCallLeg, false))
        m_ownCallLeg->removeCallLegObserver(this);
    // who hears of the final properties may drop, reuse or destroy this adapter: the leg is then gone already
    Attempt const attempt(*this);
    writeFinalProperties(cause, causeValue);
    if (attempt.isOver())
        return;
    GIVE_UP_RELEASED(*std::exchange(m_ownCallLeg, nullptr));
    if (!attempt.isOver())
        letGoOfTheRest();
}

/// Gives a reference up. A released leg may have kept its call waiting for that, or for the last live one: nobody else
/// would have the call looked at, since no state changes.
void CC_CallAdapter::GIVE_UP(CC_CallLeg& leg) { IS_RELEASED(leg) ? GIVE_UP_RELEASED(leg) : leg.removeReference(); }

void CC_CallAdapter::GIVE_UP_RELEASED(CC_CallLeg& leg)
{
    CC_Call::Hold const call(leg.getCall());
    leg.removeReference();
    if (call.get() != nullptr)
        call.get()->defer();
}

/// Tells the other legs that no data, why, and that it is over, while we are still in the call.
void CC_CallAdapter::writeFinalProperties(QCause cause, unsigned int causeValue)
{
    Attempt const attempt(*this);
    // each is written whatever became of the one before
    std::ignore = setOwnProperty(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, false));
    if (!attempt.isOver() && (cause != QCause::UNSPECIFIED || causeValue != 0))
        std::ignore = setOwnProperty(CC_PropertyCause(CC_PropertyId::CAUSE, cause, causeValue));
    if (attempt.isOver())
        return;
    CC_PropertyCallLegState const released(CC_PropertyId::STATE, CC_PropertyCallLegState::RELEASED);
    m_ownCallLeg->fixState(); // whatever the module or a peer writes when they hear of it
    bool const isFiltered = getInputFilters() != nullptr;
    bool const isWritten = setOwnProperty(released).isOk();
    // a leg that memory or a filter keeps from being released would keep its call for ever: then past our copy and the
    // filters
    if ((isFiltered || !isWritten) && !attempt.isOver() && !IS_RELEASED(*m_ownCallLeg))
        std::ignore = m_ownCallLeg->setProperty(released); // no State at all counts as released, too
}

/// Gives up what an adapter holds besides its leg.
void CC_CallAdapter::letGoOfTheRest()
{
    Attempt const attempt(*this);
    m_isPeerToBeChosen = false;
    m_ownView.clear();
    if (!attempt.isOver())
        m_peerView.clear();
    if (!attempt.isOver())
        m_callView.clear(); // while the events are there: an ending property must not begin another attempt
    if (attempt.isOver())
        return;
    if (CC_CallLeg* const peer = std::exchange(m_peerCallLeg, nullptr))
        GIVE_UP(*peer);
    if (attempt.isOver())
        return;
    for (Event** const event : {&m_secondEvent, &m_peerChangeEvent})
        if (*event != nullptr)
            std::exchange(*event, nullptr)->destroy();
    ++m_attempt;
}

XCode CC_CallAdapter::transfer(CC_CallAdapter const& other, bool removeOwnLeg)
{
    TYLifeline::Watch const self(m_lifeline);
    unsigned long long const leg = getLegSerial();
    unsigned long long const to = getCallSerial();
    unsigned long long const from = other.getCallSerial();
    XCode const result = tryTransfer(other, removeOwnLeg); // in which either adapter may go
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->addNumber(CC_RecordFormat::Kind::TRANSFERRED, to, leg, static_cast<unsigned int>(result.getValue()),
                            from, removeOwnLeg ? "transfer" : "conference");
    if (result.isOk() || !self.isAlive())
        return result;
    if (Log const log(*this, RTD::LEVEL_FAILURE); log.isWanted())
        log->debug("[EP %s/%s] TRANSFER FAILED", log.getEndpointName(), m_name.c_str());
    return result;
}

XCode CC_CallAdapter::tryTransfer(CC_CallAdapter const& other, bool removeOwnLeg)
{
    CC_Call* const to = getCall();
    CC_Call* const from = other.getCall();
    if (to == nullptr || from == nullptr || to == from)
        return XCode::REFUSED;
    CC_Call::Hold const keepTo(to);
    CC_Call::Hold const keepFrom(from);
    CC_CallLeg::Reference const keepStaying(*other.m_ownCallLeg);
    CC_CallLeg::Reference const keepOwn(*m_ownCallLeg);
    CC_CallLeg const& staying = *other.m_ownCallLeg;
    CC_CallLeg& own = *m_ownCallLeg;
    if (Log const log(*this, RTD::LEVEL_FLOW); log.isWanted())
        log->debug("[EP %s/%s] Transfer call %s to %s%s", log.getEndpointName(), m_name.c_str(),
                   from->getName().c_str(), to->getName().c_str(), removeOwnLeg ? "" : " ==> conference");
    if (removeOwnLeg)
        to->removeCallLeg(own);
    unsigned int index = 0; // above 0: of legs that are on a move of their own and go when that has ended
    for (unsigned int left = CC_Call::MOST_MOVES; CC_CallLeg* const leg = from->getOtherCallLeg(index, staying); --left)
    {
        if (left == 0 || !to->addCallLeg(*leg).isOk())
            return XCode::FAILURE;
        if (from->getOtherCallLeg(index, staying) == leg)
            ++index;
    }
    return XCode::OK;
}
