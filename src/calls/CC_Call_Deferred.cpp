// What a call decides from the event loop: its end, and whether two of its legs form an internal loop.
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_CallOwner.h"
#include "calls/CC_Monitor.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "recorder/CC_RecordWriter.h"
#include "services/CC_ServicePushBack.h"

#include <algorithm>
#include <tuple>
#include <utility>

void CC_Call::defer()
{
    if (m_deferredEvent != nullptr)
        std::ignore = m_deferredEvent->setIfNotPending(); // fails only for an event that was destroyed
}

void CC_Call::DEFERRED(void* call) { static_cast<CC_Call*>(call)->deferred(); }

namespace
{
using CleanUp = CC_RecordFormat::CleanUp;

void RECORD(unsigned long long call, CleanUp outcome)
{
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(CC_RecordFormat::Kind::CLEANED_UP, call, 0, static_cast<unsigned int>(outcome));
}
} // namespace

void CC_Call::deferred()
{
    if (isOver())
        return; // asked for from inside its end
    Hold const self(this);
    bool const wasCleaningUp = std::exchange(m_isCleaningUp, true);
    removeReleasedCallLegs();
    if (self.isReleased())
        return RECORD(m_serial, CleanUp::OVERTAKEN); // an observer was faster
    bool const isLive = hasLiveCallLeg();
    RECORD(m_serial, isLive ? CleanUp::KEPT : CleanUp::GIVEN_BACK);
    if (!isLive)
        giveBack();
    m_isCleaningUp = wasCleaningUp;
    if (isLive)
        pushBackOnLoop();
}

bool CC_Call::hasLiveCallLeg() const
{
    return std::any_of(m_callLegs.begin(), m_callLegs.end(),
                       [](CC_CallLeg const* leg) { return leg->getState() != CC_PropertyCallLegState::RELEASED; });
}

void CC_Call::giveBack()
{
    destroyParticipatingCallLegs();
    if (m_isReleased)
        return;
    if (m_callPool != nullptr)
        m_callPool->releaseCall(this);
    else
        destroy();
}

/// The call's two legs are on the same network and both up: the gateway is connected with itself, and one of the two
/// modules may take the call back onto its own side.
void CC_Call::pushBackOnLoop()
{
    CC_CallLeg* const target = findPushBackTarget();
    if (target == nullptr)
        return;
    auto const& network =
        static_cast<CC_PropertyString const&>(*m_callLegs[0]->getProperties().get(CC_PropertyId::NETWORK));
    auto const& id = static_cast<CC_PropertyUnsigned const&>(*target->getProperties().get(CC_PropertyId::CALL_LEG_ID));
    if (RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_FLOW))
        monitor->debug("[Call %s] Internal loop detected; push-back to %s", m_name.c_str(), network.getValue().c_str());
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(CC_RecordFormat::Kind::PUSHED_BACK, m_serial, target->getSerial());
    CC_ServicePushBack pushBack(id.getValue());
    target->invokeSynchronousService(pushBack);
}

/// The less active of two looped legs, by Call-Leg-ID when they are equally active; null when there is no loop.
CC_CallLeg* CC_Call::findPushBackTarget() const
{
    if (m_callLegs.getSize() != 2)
        return nullptr;
    CC_CallLeg* const legs[2] = {m_callLegs[0], m_callLegs[1]};
    int const levels[2] = {legs[0]->getActivityLevel(), legs[1]->getActivityLevel()};
    if (std::max(levels[0], levels[1]) < CC_PropertyCallLegState::CONNECTED ||
        std::min(levels[0], levels[1]) < CC_PropertyCallLegState::ALERTING)
        return nullptr;
    auto const* const network = CC_PropertyString::FROM(legs[0]->getProperties().get(CC_PropertyId::NETWORK));
    auto const* const other = CC_PropertyString::FROM(legs[1]->getProperties().get(CC_PropertyId::NETWORK));
    if (network == nullptr || other == nullptr || network->getValue() != other->getValue())
        return nullptr;
    auto const* const id = CC_PropertyUnsigned::FROM(legs[0]->getProperties().get(CC_PropertyId::CALL_LEG_ID));
    auto const* const otherId = CC_PropertyUnsigned::FROM(legs[1]->getProperties().get(CC_PropertyId::CALL_LEG_ID));
    if (id == nullptr || otherId == nullptr)
        return nullptr;
    if (levels[0] != levels[1])
        return levels[0] < levels[1] ? legs[0] : legs[1];
    return id->getValue() < otherId->getValue() ? legs[0] : legs[1];
}
