#include "sip/endpoint/SipEndpoint.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "host/Capture.h"
#include "properties/CC_Cause.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKeys.h"
#include "properties/CC_PropertyParametrizedString.h"
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_ServiceBlindTransfer.h"
#include "services/CC_ServiceBlindTransferStatus.h"
#include "services/CC_ServicePushBack.h"
#include "services/CC_ServiceUserInput.h"
#include "sip/dialog/SipAnchoredSession.h"
#include "sip/dialog/SipDirectSession.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/endpoint/SipServiceDialog.h"
#include "sip/message/SipPropertyId.h"

#include <spdlog/spdlog.h>

#include <tuple>
#include <utility>

namespace
{
/// Texts of several lines, and of columns, as the one line that a trace has for them.
std::string ON_ONE_LINE(std::string_view text)
{
    std::string line;
    char const* separator = "";
    for (char const c : text)
        if (c == '\n')
            separator = ", ";
        else if (c == ' ')
            separator = *separator == '\0' ? " " : separator;
        else
        {
            char const* const before = std::exchange(separator, "");
            line.append(line.empty() ? "" : before).append(1, c);
        }
    return line;
}

std::unique_ptr<SipSession> MAKE_SESSION(SipInterface const& interface, CC_CallAdapterE164& adapter,
                                         SipSessionWire& wire)
{
    if (!interface.getEnvironment().host.relaysMedia)
        return std::make_unique<SipDirectSession>(adapter, wire);
    return std::make_unique<SipAnchoredSession>(adapter, wire, interface.getConfiguration(),
                                                interface.getMediaAddress());
}
} // namespace

SipEndpoint::SipEndpoint(SipInterface& interface, unsigned int callNumber)
    : CC_Endpoint(nullptr, nullptr)
    , m_interface(interface)
    , m_callNumber(callNumber)
    , m_timer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_TIMER, this)
    , m_sessionOfKind(MAKE_SESSION(interface, m_adapter, *this))
    , m_session(*m_sessionOfKind)
    , m_sessionTimer(interface.getConfiguration().sessionExpires, interface.getConfiguration().leastExpires)
    , m_refreshTimer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_REFRESH_TIMER, this)
    , m_lengthTimer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_LENGTH_TIMER, this)
    , m_offerTimer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_OFFER_TIMER, this)
{
}

void SipEndpoint::ON_TIMER(void* endpoint)
{
    auto& self = *static_cast<SipEndpoint*>(endpoint);
    self.handle(
        [&]
        {
            if (self.m_heldBye != nullptr)
                self.leaveCall(SipCause(self.m_heldBye->cause));
            else if (self.m_dialog == SipDialogState::UP)
                self.onUpTimer();
            else
                self.m_isCalling ? self.onCallingTimer() : self.onCalledTimer();
        });
}

SipEndpoint::~SipEndpoint()
{
    m_adapter.cleanup();
    m_target.reset();
    answerHeldBye();
    for (nta_outgoing_t* const request : {m_refer, m_info, m_bye})
        if (request != nullptr)
        {
            nta_outgoing_bind(request, nullptr, nullptr);
            nta_outgoing_destroy(request);
        }
    forgetTransaction();
    forgetOffer();
    m_invite.forget();
    m_reinvite.forget();
    if (m_leg != nullptr)
        nta_leg_destroy(m_leg);
    forgetForks();
    endAttempts();
    for (std::vector<nta_leg_t*> const& legs : {m_otherLegs, m_formerLegs})
        for (nta_leg_t* const leg : legs)
            if (leg != nullptr)
                nta_leg_destroy(leg);
}

String const& SipEndpoint::getName() const { return m_interface.getName(); }

String const& SipEndpoint::getNetwork() const { return m_interface.getName(); }

InfoContainer& SipEndpoint::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                    unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    String text;
    text.format("%s/%u, %s side, dialog %s", getName().c_str(), m_callNumber, m_isCalling ? "calling" : "called",
                SipDialogState::NAME(m_dialog));
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Endpoint", text);
    return info;
}

void SipEndpoint::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags)
{
    if (&adapter == &m_adapter)
        handle([&] { followCall(flags); });
    else
        handle([&] { followTarget(); });
}

void SipEndpoint::followCall(CC_Flags const& flags)
{
    traceFlags(flags);
    m_session.followCall();
    followCharge(flags);
    if (isPeerReleased())
    {
        if (!m_isTransferring) // else our peer is to have the target
            onPeerReleased();
        return;
    }
    if (m_isNumberOpen && !isPeerDialling())
        endNumber();
    if (m_dialog == SipDialogState::INVITE_RECEIVED && m_isReplacing)
        m_session.follow(false);
    else if (m_dialog == SipDialogState::INVITE_RECEIVED)
        followPeer();
    if (isAgreedEarly())
        m_session.follow(false);
    else if (m_dialog == SipDialogState::ANSWERED || m_dialog == SipDialogState::UP)
        m_session.follow(m_dialog == SipDialogState::UP && m_lateAck == nullptr && !m_isOffering &&
                         m_offerReceived == nullptr);
}

void SipEndpoint::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
{
    if (&adapter == &m_adapter)
        handle([&] { takeService(service); });
}

void SipEndpoint::takeService(CC_Service& service)
{
    if (service.isOfType(CC_ServiceBlindTransfer::TYPE()))
        onBlindTransfer(static_cast<CC_ServiceBlindTransfer&>(service));
    else if (service.isOfType(CC_ServiceBlindTransferStatus::TYPE()))
        endReferral(static_cast<CC_ServiceBlindTransferStatus&>(service).getCause());
    else if (service.isOfType(CC_ServiceUserInput::TYPE()))
        onUserInput(static_cast<CC_ServiceUserInput&>(service));
    else if (service.isOfType(CC_ServicePushBack::TYPE()))
        onPushBack();
    else if (service.isOfType(SipServiceDialog::TYPE()))
        tellDialog(static_cast<SipServiceDialog&>(service));
    else
        trace("told a service, not taken: " + std::string(service.getInfo().view()));
}

/// A peer that left without a State of its own counts as released, and one that waits for the call's end, to whom there
/// is nothing to listen any more; a call to which nobody has come yet does not.
bool SipEndpoint::isPeerReleased() const
{
    auto const* const state = getPeer<CC_PropertyCallLegState>(CC_PropertyId::STATE);
    if (state == nullptr)
        return m_hadPeer;
    return state->getState() == CC_PropertyCallLegState::RELEASED || isPeerWaiting();
}

bool SipEndpoint::isPeerWaiting() const
{
    auto const* const state = getPeer<CC_PropertyCallLegState>(CC_PropertyId::STATE);
    return state != nullptr && state->getState() == CC_PropertyCallLegState::DISCONNECTING &&
           !m_adapter.getPeer(Key::PROVIDES_DATA, false);
}

void SipEndpoint::onPeerReleased()
{
    if (m_failure)
        return; // our peer is hearing of it
    SipCause const cause =
        SipCause::FROM_PROPERTY(dynamic_cast<CC_PropertyCause const*>(m_adapter.getPeerCauseProperty()));
    if (m_isReferring)
        endReferral(QCause::SUBSCRIBER_ABSENT); // nobody is there to be transferred
    if (m_heldBye != nullptr)
    {
        leaveCall(SipCause(m_heldBye->cause));
        return;
    }
    if (goElsewhere(cause) || tryNextRoute(cause) || tellByTone(cause))
        return;
    endDialog(cause);
    if (!awaitsBill())
        leaveCall(cause);
}

bool SipEndpoint::isInCall(unsigned long long serial) const
{
    CC_Call const* const call = m_isInCall ? m_adapter.getCall() : nullptr;
    return call != nullptr && call->getSerial() == serial;
}

void SipEndpoint::clear(SipCause const& cause)
{
    try
    {
        endDialog(cause);
        leaveCall(cause);
    }
    catch (std::bad_alloc const&)
    {
        endWithoutWords();
    }
}

/// Not even the words of an end can be had: our end gives up what the SIP stack has, and that says what it can.
void SipEndpoint::endWithoutWords()
{
    if (std::exchange(m_isInCall, false))
        m_adapter.drop(QCause::RESOURCE_UNAVAILABLE, 0);
    m_dialog = SipDialogState::OVER;
    finishIfDone();
}

/// Takes the leg out of the call, with the cause in the peer's words.
void SipEndpoint::leaveCall(SipCause const& cause)
{
    endAttempts();
    answerHeldBye();
    if (!std::exchange(m_isInCall, false))
    {
        finishIfDone();
        return;
    }
    m_routes.leave();
    m_targetRoutes.leave();
    if (std::exchange(m_isTransferring, false) && m_target != nullptr)
        m_target->drop(cause.cause, 0); // our peer has gone: nobody is there to be transferred
    m_adapter.drop(sayWhy(cause) ? QCause::UNSPECIFIED : cause.cause, 0);
    m_session.end();
    if (m_isCalling)
    {
        Counters& counters = m_interface.getEnvironment().host.counters;
        ++(m_wasAnswered ? counters.cleared : counters.failed);
    }
    spdlog::debug("call {} {} ({} side) released: cause {} ({}), SIP {}{}{}{}", m_callNumber, getName().view(),
                  m_isCalling ? "calling" : "called", static_cast<int>(cause.cause), CAUSE_SHORT_NAME(cause.cause),
                  cause.sipCode, cause.text.empty() ? "" : ", \"", cause.text, cause.text.empty() ? "" : "\"");
    finishIfDone();
}

/// Whether the cause is written, with the peer's words; without memory for these only the drop says it.
bool SipEndpoint::sayWhy(SipCause const& cause)
{
    try
    {
        recordQuality();
        CC_PropertyContainer last;
        addCallId(last);
        bool const isWritten = last.set(cause.getProperty()).isOk() && writeOwn(last).isOk();
        if (isTraced())
            trace("did  drop, State=RELEASED");
        return isWritten;
    }
    catch (std::bad_alloc const&)
    {
        return false;
    }
}

/// Of the dialog; empty: there is none.
std::string SipEndpoint::getCallId() const
{
    SipHome const home(su_home_create());
    sip_replaces_t const* const dialog = m_leg != nullptr ? nta_leg_make_replaces(m_leg, home.get(), 0) : nullptr;
    return dialog != nullptr ? dialog->rp_call_id : "";
}

/// For the call's record.
void SipEndpoint::addCallId(CC_PropertyContainer& own) const
{
    std::string const callId = getCallId();
    if (callId.empty())
        return;
    CC_PropertyParametrizedString id(CC_PropertyId::UNIQUE_IDENTIFIER);
    id.setContent(0, CC_PropertyParametrizedString::ParametrizedString(String(std::string_view(callId))));
    std::ignore = own.set(id);
}

/// While the leg is still in the call, so that the other side sees it.
void SipEndpoint::recordQuality()
{
    std::optional<MediaQuality> const measured = m_session.getQuality();
    std::optional<CC_QoS> const record = m_quality.getRecord(measured ? &*measured : nullptr);
    if (!record)
        return;
    if (isTraced())
        trace("did  " + TEXT_OF(CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE, *record)));
    std::ignore = m_adapter.setOwnQoS(*record); // without memory the call ends without a record
}

/// Every ten seconds while the call is up, besides that of its end.
void SipEndpoint::onQuality()
{
    if (m_dialog == SipDialogState::UP && m_isInCall && ++m_qualitiesTold % 2 == 0)
        handle([&] { recordQuality(); });
}

void SipEndpoint::onReport(MediaReport const& report)
{
    if (Capture* const capture = m_interface.getEnvironment().host.capture)
        capture->show(report, getCallId());
}

SipDialogState::Action SipEndpoint::advance(SipDialogState::Event event)
{
    SipDialogState::Step const step = SipDialogState::STEP(m_dialog, event);
    m_dialog = step.next;
    return step.action;
}

void SipEndpoint::finishIfDone()
{
    if (m_dialog != SipDialogState::OVER || m_isInCall || std::exchange(m_isFinished, true))
        return;
    m_timer.stop();
    m_offerTimer.stop();
    m_refreshTimer.stop();
    m_lengthTimer.stop();
    m_interface.finish(*this);
}

XCode SipEndpoint::writeOwn(CC_PropertyContainer const& properties)
{
    if (isTraced())
        trace("did  " + TEXT_OF(properties));
    return m_adapter.setOwnProperties(properties);
}

// --- trace -----------------------------------------------------------------------------------------------------------

void SipEndpoint::trace(std::string text) const
{
    if (isTraced())
        m_ladder->add(m_isCalling ? CallTrace::LEFT : CallTrace::RIGHT, std::move(text));
}

void SipEndpoint::traceFlags(CC_Flags const& flags) const
{
    if (!isTraced())
        return;
    for (unsigned int id = flags.getFirstSet(0); id != CC_Flags::NONE; id = flags.getFirstSet(id + 1))
    {
        CC_Property const* const ofPeer = m_adapter.getPeerProperty(id);
        CC_Property const* const ofCall = m_adapter.getCallProperty(id);
        if (ofPeer != nullptr)
            trace("told peer " + TEXT_OF(*ofPeer));
        else if (ofCall != nullptr)
            trace("told call " + TEXT_OF(*ofCall));
        else
            trace(std::string("told gone ") + SipPropertyId::NAME(id));
    }
}

std::string SipEndpoint::TEXT_OF(CC_Property const& property)
{
    String value;
    property.getValueString(value);
    std::string const name = SipPropertyId::NAME(property.getId());
    return name + "=" + ON_ONE_LINE(value.view());
}

std::string SipEndpoint::TEXT_OF(CC_PropertyContainer const& properties)
{
    std::string text;
    for (CC_Property const& property : properties)
        text += (text.empty() ? "" : ", ") + TEXT_OF(property);
    return text;
}
