#include "isdn/endpoint/IsdnEndpoint.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "isdn/element/IsdnCause.h"
#include "isdn/endpoint/IsdnEndpoint_Ask.h"
#include "properties/CC_Cause.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyKeys.h"
#include "services/CC_ServiceUserInput.h"

#include <spdlog/spdlog.h>

#include <tuple>
#include <utility>

namespace
{
constexpr unsigned int LOOK = 200; // milliseconds between looks whether a call that is being cleared is gone
} // namespace

IsdnEndpoint::IsdnEndpoint(IsdnInterface& interface, unsigned int callNumber)
    : CC_Endpoint(nullptr, nullptr)
    , m_interface(interface)
    , m_callNumber(callNumber)
    , m_timer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_TIMER, this)
{
}

IsdnEndpoint::~IsdnEndpoint()
{
    m_adapter.cleanup();
    if (m_call == nullptr)
        return;
    m_interface.forget(m_call); // the stack clears it, and nobody hears of that
    ask([&](pri* stack) { return pri_hangup(stack, m_call, IsdnCause::TO_WIRE(QCause::TEMPORARY_FAILURE)); });
}

String const& IsdnEndpoint::getName() const { return m_interface.getName(); }

String const& IsdnEndpoint::getNetwork() const { return m_interface.getName(); }

InfoContainer& IsdnEndpoint::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                     unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    String text;
    text.format("%s, %s side, timeslot %u, %s", getName().c_str(), m_isCalling ? "calling" : "called", m_timeslot,
                IsdnCallState::NAME(m_state));
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Endpoint", text);
    return info;
}

void IsdnEndpoint::onEvent(pri_event& event)
{
    handle([&] { take(event); });
}

void IsdnEndpoint::take(pri_event& event)
{
    switch (event.e)
    {
    case PRI_EVENT_HANGUP_REQ:
        onDisconnect(event.hangup);
        break;
    case PRI_EVENT_HANGUP:
    case PRI_EVENT_HANGUP_ACK:
        onReleased(event.hangup, event.e == PRI_EVENT_HANGUP_ACK);
        break;
    case PRI_EVENT_INFO_RECEIVED:
        onDigits(event.ring.callednum);
        if (event.ring.complete != 0 && m_state == IsdnCallState::OVERLAP_RECEIVING && m_isInCall)
            endNumber();
        break;
    case PRI_EVENT_KEYPAD_DIGIT:
        onDigits(event.digit.digits);
        break;
    case PRI_EVENT_NOTIFY:
        onNotify(event.notify.info);
        break;
    case PRI_EVENT_HOLD:
        onHold();
        break;
    case PRI_EVENT_RETRIEVE:
        onRetrieve(event.retrieve);
        break;
    case PRI_EVENT_FACILITY:
        m_own.clear();
        readCommands(event.facility.subcmds, m_own);
        std::ignore = m_adapter.setOwnProperties(m_own);
        break;
    default:
        followWire(event);
    }
}

void IsdnEndpoint::notifyPeerPropertyChange(CC_CallAdapter&, CC_Flags const& flags)
{
    handle([&] { followCall(flags); });
}

void IsdnEndpoint::followCall(CC_Flags const& flags)
{
    if (m_failure != QCause::NONE)
        return; // the far side is hearing of it
    if (isPeerReleased())
    {
        tellCharge(flags); // the last one goes with the end
        if (m_heldRelease != QCause::NONE)
        {
            leaveCall(m_heldRelease);
            return;
        }
        QCause const cause = getPeerCause();
        if (tryNextRoute(cause) || tellByTone(cause))
            return;
        endWire(cause);
        if (m_state != IsdnCallState::CLEARING || !isPeerWaiting())
            leaveCall(cause);
        return;
    }
    openMedia(); // the call may be another one
    if (m_isCalling)
        followPeer();
    else if (m_state == IsdnCallState::NULL_STATE && !m_adapter.getPeerSupportsOverlapSending())
        onTimer(); // no digit is to be waited for any more
    tellCharge(flags);
    tellHold();
    tellTransfer();
}

void IsdnEndpoint::notifyPeerSynchronousService(CC_CallAdapter&, CC_Service& service)
{
    if (service.isOfType(CC_ServiceUserInput::TYPE()))
        handle([&] { onUserInput(static_cast<CC_ServiceUserInput&>(service)); });
}

IsdnEndpoint::LegState::State IsdnEndpoint::getPeerState() const
{
    auto const state = m_adapter.getPeer(Key::STATE);
    return state ? state->getState() : m_hadPeer ? LegState::RELEASED : LegState::TRYING;
}

/// A peer that left without a State of its own counts as released, and one that waits for the call's end; a call to
/// which nobody has come yet does not.
bool IsdnEndpoint::isPeerReleased() const { return getPeerState() == LegState::RELEASED || isPeerWaiting(); }

/// It has hung up, hears nothing any more, and is there for what the far side's last message tells.
bool IsdnEndpoint::isPeerWaiting() const { return getPeerState() == LegState::DISCONNECTING && !hasPeerData(); }

QCause IsdnEndpoint::getPeerCause() const
{
    auto const cause = m_adapter.getPeer(Key::CAUSE);
    return cause ? cause->getCause() : QCause::NONE;
}

bool IsdnEndpoint::hasPeerData() const { return m_adapter.getPeer(Key::PROVIDES_DATA, false); }

IsdnCallState::Action IsdnEndpoint::advance(IsdnCallState::Event event)
{
    IsdnCallState::Step const step = IsdnCallState::STEP(m_state, event);
    m_state = step.next;
    return step.action;
}

/// What comes between DISCONNECT and RELEASE: tones, for which we do not wait (Q.931, 5.3.3 leaves it to us).
void IsdnEndpoint::onDisconnect(pri_event_hangup const& hangup)
{
    if (advance(IsdnCallState::DISCONNECT_IN) == IsdnCallState::IGNORE)
        return;
    QCause const cause = IsdnCause::FROM_WIRE(hangup.cause);
    m_own.clear();
    readCommands(hangup.subcmds, m_own);
    readUserUser(hangup.useruserinfo, m_own);
    if (m_isInCall && !m_own.isEmpty())
        std::ignore = m_adapter.setOwnProperties(m_own);
    m_heldRelease = cause;
    if (awaitsFinalCharge())
        holdRelease(cause);
    else
        leaveCall(cause);
}

/// `isGivenUp`: the stack has the call no more; else it waits for us.
void IsdnEndpoint::onReleased(pri_event_hangup const& hangup, bool isGivenUp)
{
    if (advance(IsdnCallState::RELEASED_IN) == IsdnCallState::IGNORE)
        return;
    QCause const cause = m_isInCall && isPeerWaiting() ? getPeerCause() : IsdnCause::FROM_WIRE(hangup.cause);
    m_own.clear();
    readCommands(hangup.subcmds, m_own);
    readUserUser(hangup.useruserinfo, m_own);
    if (m_isInCall && !m_own.isEmpty())
        std::ignore = m_adapter.setOwnProperties(m_own);
    q931_call* const call = std::exchange(m_call, nullptr);
    m_interface.forget(call);
    if (!isGivenUp)
        ask([&](pri* stack) { return pri_hangup(stack, call, -1); });
    leaveCall(cause);
}

void IsdnEndpoint::loseCall()
{
    m_call = nullptr;
    m_state = IsdnCallState::OVER;
    leaveCall(QCause::NORMAL_UNSPECIFIED);
}

bool IsdnEndpoint::isInCall(unsigned long long serial) const
{
    CC_Call const* const call = m_isInCall ? m_adapter.getCall() : nullptr;
    return call != nullptr && call->getSerial() == serial;
}

void IsdnEndpoint::clear(QCause cause)
{
    endWire(cause);
    leaveCall(cause);
}

void IsdnEndpoint::endWire(QCause cause)
{
    if (m_state == IsdnCallState::CALL_PRESENT) // the stack clears no call that it has not answered
    {
        advance(IsdnCallState::PROCEEDING_OUT);
        ask([&](pri* stack) { return pri_proceeding(stack, m_call, getChannel(), 0); });
    }
    if (advance(IsdnCallState::CLEAR_OUT) != IsdnCallState::DISCONNECT || m_call == nullptr)
        return;
    sendUserUser();
    ask([&](pri* stack) { return pri_hangup(stack, m_call, IsdnCause::TO_WIRE(cause)); });
    lookForEnd();
}

/// The stack tells nothing of the end of some calls, such as one that was cleared with RELEASE for its cause; but it
/// knows them no more.
void IsdnEndpoint::lookForEnd()
{
    int mode = 0;
    bool const isThere = ask([&](pri* stack) { return pri_get_crv(stack, m_call, &mode); }) >= 0;
    if (isThere)
    {
        m_timer.start(LOOK);
        return;
    }
    m_interface.forget(std::exchange(m_call, nullptr));
    m_state = IsdnCallState::OVER;
}

/// Takes the leg out of the call.
void IsdnEndpoint::leaveCall(QCause cause)
{
    m_failure = QCause::NONE;
    sendHeldRelease();
    if (m_state != IsdnCallState::CLEARING)
        m_timer.stop();
    if (m_isCalling && !std::exchange(m_isCounted, true))
    {
        Counters& counters = m_interface.getEnvironment().counters;
        ++(m_wasAnswered ? counters.cleared : counters.failed);
    }
    if (!std::exchange(m_isInCall, false))
    {
        finishIfDone();
        return;
    }
    m_adapter.drop(cause, 0);
    m_media.reset();
    if (m_isCalling)
        spdlog::debug("call {} {} (calling side, timeslot {}) released: cause {} ({})", m_callNumber, getName().view(),
                      m_timeslot, static_cast<int>(cause), CAUSE_SHORT_NAME(cause));
    else // who dialled knows its number
        spdlog::debug("{} (called side, timeslot {}) released: cause {} ({})", getName().view(), m_timeslot,
                      static_cast<int>(cause), CAUSE_SHORT_NAME(cause));
    finishIfDone();
}

void IsdnEndpoint::finishIfDone()
{
    if (m_state != IsdnCallState::OVER || m_isInCall || std::exchange(m_isFinished, true))
        return;
    m_interface.getChannels().giveBack(std::exchange(m_timeslot, IsdnChannels::NONE));
    m_interface.finish(*this);
}

void IsdnEndpoint::ON_TIMER(void* endpoint)
{
    auto& self = *static_cast<IsdnEndpoint*>(endpoint);
    self.handle([&] { self.onTimer(); });
}
