// The called side: the call was offered, the INVITE is sent, its answers become states of the leg.
#include "sip/endpoint/SipEndpoint.h"

#include "calls/CC_Call.h"
#include "host/EmergencyCall.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCallProgressTone.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipContent.h"
#include "sip/message/SipDiversion.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipPrivacy.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"
#include "sip/message/SipService.h"

#include <algorithm>
#include <tuple>
#include <utility>

using namespace SipProperty;

namespace
{
constexpr unsigned int DEFAULT_MAX_FORWARDS = 69;
constexpr unsigned int LONGEST_REPETITION = 32000; // milliseconds for which a peer repeats an answer by default

void ADD_STATE(CC_PropertyContainer& properties, CC_PropertyCallLegState::State state)
{
    ADD(properties, CC_PropertyCallLegState(CC_PropertyId::STATE, state)); // a later answer tells more
}

/// Whole lines. Who transfers may have withheld his number, which Referred-By would tell.
std::string FOR_PEER(std::string_view lines, bool isTrusted)
{
    constexpr std::string_view REFERRED_BY = "Referred-By:";
    std::string result;
    while (!lines.empty())
    {
        std::size_t const end = lines.find('\n');
        std::string_view const line = end == std::string_view::npos ? lines : lines.substr(0, end + 1);
        if (isTrusted || !line.starts_with(REFERRED_BY))
            result += line;
        lines.remove_prefix(line.size());
    }
    return result;
}

/// Who answers, if the answer says so.
void ADD_CONNECTED(CC_PropertyContainer& properties, sip_t const* response, bool isTrusted)
{
    if (std::optional<SipParty> const connected = SipIdentity::READ_CONNECTED(response, isTrusted))
        connected->addTo(properties);
    else if (std::string const name = SipIdentity::READ_NAME_OF_TO(response);
             !name.empty() && !SipPrivacy::RESTRICTS_SENDER(response))
        ADD_TEXT(properties, CC_PropertyId::NAME, name); // most often the one that our INVITE had
}
} // namespace

XCode SipEndpoint::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    try
    {
        return acceptOffer(call, name, properties);
    }
    catch (std::bad_alloc const&)
    {
        if (!m_isInCall)
            return XCode::FAILURE;
        clear({QCause::RESOURCE_UNAVAILABLE, 503, {}});
        return XCode::OK;
    }
}

XCode SipEndpoint::acceptOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    m_ladder = m_interface.getEnvironment().host.trace.find(m_callNumber);
    if (isTraced())
        trace("told offer " + std::string(name.view()) + (properties.isEmpty() ? "" : ", ") + TEXT_OF(properties));
    String adapterName;
    adapterName.format("%u", m_callNumber);
    SipParty called = SipParty::OF_OFFER(properties);
    if (called.number.empty())
        called.number = name.view();
    if (XCode const bound = m_adapter.setup(adapterName, *this, this); !bound.isOk())
        return bound;
    if (XCode const accepted = m_adapter.accept(call, STRING(called.number), called.type, called.plan,
                                                called.presentation, called.screening, STRING(called.name));
        !accepted.isOk())
        return accepted;
    m_isInCall = true;
    m_hadPeer = true;
    if (isTraced())
        trace("did  accept as " + called.getText() + ", State=TRYING");
    bool const isEmergency = m_adapter.getCallProperty(EmergencyCall::PROPERTY) != nullptr;
    bool const isOutOfService =
        !isEmergency && m_interface.getEnvironment().host.isBlocked(m_interface.getConfiguration().name);
    if (isOutOfService)
        clear({QCause::TEMPORARY_FAILURE, 503, {}});
    else if (!m_session.open())
        clear({QCause::RESOURCE_UNAVAILABLE, 503, {}});
    else if (m_ownSession = m_session.readFirstOffer(); m_ownSession.empty() && !m_session.isAgreed())
        giveUp(); // neither of the two sides would understand the other
    else if (!sendInvite(called, properties))
        clear({QCause::NETWORK_OUT_OF_ORDER, 503, {}});
    return XCode::OK;
}

bool SipEndpoint::sendInvite(SipParty const& called, CC_PropertyContainer const& offerProperties)
{
    auto const* const maxForwards =
        dynamic_cast<CC_PropertyUnsigned const*>(offerProperties.get(SipPropertyId::MAX_FORWARDS));
    auto const* const forTarget = CC_PropertyString::FROM(offerProperties.get(SipPropertyId::HEADERS_FOR_TARGET));
    if (!findContacts(called.getUser()) || !findWay(offerProperties) || !findPeer())
        return true;
    if (forTarget != nullptr)
        m_headersForTarget = FOR_PEER(forTarget->getValue().view(), m_interface.getConfiguration().isTrusted);
    m_maxForwards = maxForwards != nullptr ? static_cast<unsigned int>(maxForwards->getValue()) : DEFAULT_MAX_FORWARDS;
    if (auto const* const hops = CC_PropertyUnsigned::FROM(m_adapter.getCallProperty(CC_PropertyId::HOPS));
        hops != nullptr && hops->getValue() != 0)
        m_maxForwards = std::min(m_maxForwards, static_cast<unsigned int>(hops->getValue()));
    m_called = called;
    return beginNumber();
}

/// An INVITE for the number as far as it is known.
bool SipEndpoint::inviteNumber()
{
    SipConfiguration const& configuration = m_interface.getConfiguration();
    SipParty const& called = m_called;
    SipIdentity const caller{SipParty::OF_PEER(m_adapter), SipParty::SECOND_OF_PEER(m_adapter)};
    bool const isService = m_contacts.empty() && SipService::IS_ONE(called.number);
    m_inviteRoute = isService ? "<" + makePeerUri({}) + ";lr>" : std::string();
    std::string const uri = isService ? called.number
                            : m_contacts.empty()
                                ? makePeerUri(called.getUser())
                                : SipAddress::MAKE_URI(called.getUser(), configuration.getAddress(), SipWay::UDP);
    std::string const to = SipAddress::MAKE_NAME_ADDR(called.name, uri);
    char const* const tag = m_leg != nullptr ? nta_leg_get_tag(m_leg) : nullptr;
    m_leg = makeClientLeg(caller.getFrom(configuration.getAddress()), to);
    if (m_leg == nullptr || nta_leg_tag(m_leg, tag) == nullptr)
        return false;
    SipDiversion const diversion = SipDiversion::OF_PEER(m_adapter);
    m_inviteHeaders = SipIdentity::GET_ASSERTED(caller.party, configuration.getAddress(), configuration.isTrusted);
    if (configuration.isTrusted || !diversion.isRestricted())
        m_inviteHeaders += diversion.getHeaders(configuration.getAddress(), uri);
    m_inviteHeaders += m_headersForTarget + getCarried(SipCarriedHeaders::REQUEST);
    m_inviteUri = m_contacts.empty() ? uri : m_contacts.front().uri;
    if (!m_contacts.empty())
        m_inviteRoute = m_contacts.front().route;
    return startInvite();
}

bool SipEndpoint::startInvite()
{
    std::string const hops = std::to_string(m_maxForwards);
    std::string const headers = m_inviteHeaders + m_sessionTimer.getRequestHeaders();
    bool const takesCharges = m_interface.getConfiguration().charges == SipConfiguration::Charges::TAKE;
    m_hasOffer = !m_ownSession.empty();
    noteSession(SipOfferAnswer::SENT, SipOfferAnswer::INVITE, m_ownSession);
    trace("-> INVITE " + m_inviteUri + (m_inviteRoute.empty() ? "" : " by " + m_inviteRoute) +
          (m_hasOffer ? " with a session description" : ""));
    SipContent const content = SipContent::OF(m_ownSession, {}, getIsup());
    sip_payload_t const payload = content.getPayload();
    m_invite.transaction = m_interface.getSender().send(
        m_leg, HANDLE_INVITE_RESPONSE, this, SIP_METHOD_INVITE, URL_STRING_MAKE(m_inviteUri.c_str()),
        SIPTAG_CONTACT_STR(getContact()), SIPTAG_MAX_FORWARDS_STR(hops.c_str()), SIPTAG_ALLOW(m_interface.getAllow()),
        SIPTAG_SUPPORTED_STR(m_hasOffer ? "100rel, replaces, timer" : "replaces, timer"),
        TAG_IF(takesCharges, SIPTAG_ACCEPT_STR("application/sdp, application/vnd.etsi.aoc+xml")),
        TAG_IF(!m_inviteRoute.empty(), SIPTAG_ROUTE_STR(m_inviteRoute.c_str())),
        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
        TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
        TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD(&payload)), TAG_END());
    if (m_invite.transaction == nullptr)
        return false;
    m_invite.sequence = nta_leg_get_seq(m_leg);
    advance(SipDialogState::INVITE_OUT); // nothing happens when it is sent again
    SipConfiguration const& configuration = m_interface.getConfiguration();
    m_isUnheard = m_peers.size() > 1 && configuration.failoverAfter != 0;
    m_timer.start(m_isUnheard ? configuration.failoverAfter : configuration.answerTimeout * 1000);
    return true;
}

int SipEndpoint::HANDLE_INVITE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response)
{
    int const status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(transaction);
    endpoint->handle(
        [&]
        {
            if (endpoint->isOfAttempt(transaction, status))
                return;
            if (status < 200)
                endpoint->onProvisional(static_cast<unsigned int>(status), response);
            else if (status < 300 && response != nullptr && response->sip_to != nullptr)
                endpoint->onAnswer(response);
            else
                endpoint->onRejected(static_cast<unsigned int>(status), response);
        });
    return 0;
}

void SipEndpoint::onProvisional(unsigned int status, sip_t const* response)
{
    if (m_dialog != SipDialogState::INVITE_SENT || response == nullptr)
        return;
    trace("<- " + std::to_string(status));
    noteHeard();
    if (status > 100)
        endAttempts(); // its number is complete
    else if (m_isNumberOpen)
        return; // nothing is said of the number
    Fork* const fork = findFork(response);
    m_hasRung = m_hasRung || status == 180;
    if (fork != nullptr && status == 180)
        fork->hasRung = true;
    bool const isReliable = fork != nullptr && response->sip_rseq != nullptr && m_hasOffer &&
                            sip_has_feature(response->sip_require, "100rel") != 0;
    if (isReliable && !acceptReliably(*fork, response))
        return;
    bool const isRinging = fork != nullptr ? fork->hasRung : m_hasRung;
    CC_PropertyContainer own;
    std::string const session = SESSION_OF(response);
    addFork(own, fork);
    ADD_CONNECTED(own, response, m_interface.getConfiguration().isTrusted);
    addCarried(own, response);
    addTariff(own, response);
    if (m_hasOffer && (fork == nullptr || !fork->isAgreed))
        addSession(own, session, isReliable);
    if (isReliable && !session.empty() && !std::exchange(fork->isAgreed, true))
        noteSession(SipOfferAnswer::RECEIVED, SipOfferAnswer::RELIABLE, session);
    if (status == 183) // an announcement or a tone may come even when the description did earlier
        ADD(own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    bool const hasData = m_hasEarlyMedia || status == 183 || !session.empty();
    m_hasEarlyMedia = hasData;
    addTone(own, isRinging && !hasData);
    ADD_STATE(own, isRinging ? CC_PropertyCallLegState::ALERTING : CC_PropertyCallLegState::PROCEEDING);
    std::ignore = writeOwn(own); // what memory refuses the other side does not hear; the next answer may fit
}

/// Whether the other side is to have its peer hear that ours rings, since ours lets nothing be heard itself.
void SipEndpoint::addTone(CC_PropertyContainer& own, bool isRinging)
{
    if (std::exchange(m_asksForTone, isRinging) != isRinging)
        ADD(own, CC_PropertyCallProgressTone(CC_PropertyId::CALL_PROGRESS_TONE,
                                             isRinging ? MG_Tones::ECallProgressTone::RINGING
                                                       : MG_Tones::ECallProgressTone::NONE));
}

/// What an answer with a session description brings: the description, and that media may come.
void SipEndpoint::addSession(CC_PropertyContainer& own, std::string const& session, bool isBinding)
{
    if (session.empty())
        return;
    if (m_hasOffer)
    {
        m_quality.noteAnswer(session);
        m_session.addAnswer(own, session, isBinding);
    }
    else
        m_session.addOffer(own, session);
    ADD(own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
}

void SipEndpoint::onAnswer(sip_t const* response)
{
    trace("<- 200");
    switch (advance(SipDialogState::ANSWER_IN))
    {
    case SipDialogState::PROCEED:
        endAttempts();
        confirmDialog(response);
        takeAnswer(response);
        forgetSetUp();
        break;
    case SipDialogState::ACK_AND_BYE:
        confirmDialog(response);
        acknowledge(m_invite, {});
        sendBye(m_byeAfterAck.value_or(SipCause{}));
        break;
    case SipDialogState::ACKNOWLEDGE:
        if (m_lateAck != &m_invite)
            acknowledge(m_invite, {});
        break;
    default:
        break;
    }
}

/// Whoever offered first has the other's answer now, or our peer has offered and its answer comes with the ACK.
void SipEndpoint::takeAnswer(sip_t const* response)
{
    m_wasAnswered = true;
    m_challenges = 0;
    m_timer.start(std::max(m_interface.getConfiguration().t1x64, LONGEST_REPETITION));
    noteAllow(response);
    takeTimerOfAnswer(response);
    Fork const* const fork = findFork(response);
    bool const isAgreed = fork != nullptr && fork->isAgreed; // then a description says nothing new
    std::string const session = isAgreed ? std::string() : SESSION_OF(response);
    if (!isAgreed && m_negotiation.getState() == SipOfferAnswer::AGREED) // with another party
        m_negotiation = SipOfferAnswer();
    if (!isAgreed && m_negotiation.getState() == SipOfferAnswer::NEW && m_hasOffer)
        m_negotiation.note(SipOfferAnswer::SENT, SipOfferAnswer::INVITE);
    if (!isAgreed)
        noteSession(SipOfferAnswer::RECEIVED, SipOfferAnswer::FINAL, session);
    if (m_hasOffer || session.empty())
        acknowledge(m_invite, {});
    else
    {
        m_lateAck = &m_invite;
        m_offerOfPeer = session;
    }
    CC_PropertyContainer own;
    addFork(own, fork);
    ADD_CONNECTED(own, response, m_interface.getConfiguration().isTrusted);
    addCarried(own, response);
    addTariff(own, response);
    addSession(own, session, true);
    addTone(own, false);
    ADD_STATE(own, CC_PropertyCallLegState::CONNECTED);
    if (!m_session.isAgreed())
        giveUp();
    else if (!writeOwn(own).isOk())
        clear({QCause::RESOURCE_UNAVAILABLE, 0, {}}); // nobody would ever hear of the answer
}

void SipEndpoint::onRejected(unsigned int status, sip_t const* response)
{
    bool const isOurs = response == nullptr || nta_sip_is_internal(response); // the stack's word for a peer's silence
    if (status == 422 && m_dialog == SipDialogState::INVITE_SENT && raiseTimer(response))
    {
        trace("<- 422");
        m_invite.forget();
        m_negotiation.fail();
        if (!startInvite())
            clear({QCause::NETWORK_OUT_OF_ORDER, 503, {}});
        return;
    }
    if (m_dialog == SipDialogState::INVITE_SENT &&
        authenticate(m_invite.transaction, response, m_leg, HANDLE_INVITE_RESPONSE))
    {
        m_invite.sequence = nta_leg_get_seq(m_leg);
        noteHeard();
        return;
    }
    if (awaitMoreDigits(status) || tryAnother(status, response))
        return;
    if (advance(SipDialogState::REJECTED) == SipDialogState::IGNORE)
        return;
    trace(isOurs ? "no answer to the INVITE (" + std::to_string(status) + ")" : "<- " + std::to_string(status));
    m_invite.forget();
    if (!isOurs)
    {
        takeCarried(response);
        tellRedirection(response);
    }
    if (isOurs)
        leaveCall({status == 408 ? QCause::NO_USER_RESPONDING : QCause::DESTINATION_OUT_OF_ORDER, status, {}});
    else
        leaveCall(SipCause::FROM_RESPONSE(status, response->sip_status->st_phrase, REASON_OF(response)));
}

/// The callee has rung for too long; or, after a CANCEL, does not end its INVITE.
void SipEndpoint::onAnswerTimeout()
{
    if (m_isNumberOpen && m_invite.transaction == nullptr)
    {
        endNumber();
        return;
    }
    if (advance(SipDialogState::TIMEOUT) == SipDialogState::IGNORE)
        return;
    if (m_dialog == SipDialogState::OVER)
    {
        m_invite.forget();
        finishIfDone();
        return;
    }
    trace("the callee has not answered in time");
    bool const hasRung = m_hasRung;
    clear({hasRung ? QCause::NO_ANSWER_FROM_USER : QCause::NO_USER_RESPONDING, hasRung ? 480u : 408u, {}});
}

void SipEndpoint::confirmDialog(sip_t const* response)
{
    if (Fork* const fork = findFork(response); fork != nullptr && fork->leg != nullptr)
    {
        nta_leg_destroy(m_leg);
        m_leg = std::exchange(fork->leg, nullptr);
    }
    nta_leg_rtag(m_leg, response->sip_to->a_tag);
    routeAsClient(m_leg, m_invite.transaction, response);
    m_timer.stop();
}

void SipEndpoint::acknowledge(Invitation& invitation, std::string const& sessionDescription)
{
    // another request may have gone out since, but the ACK bears the INVITE's number
    std::string const sequence = std::to_string(invitation.sequence) + " ACK";
    bool const hasSession = !sessionDescription.empty();
    trace(std::string("-> ACK") + (hasSession ? " with a session description" : ""));
    if (m_lateAck == &invitation)
        m_lateAck = nullptr;
    if (hasSession)
        m_ownSession = sessionDescription;
    m_interface.getSender().acknowledge(m_leg, invitation.transaction, SIPTAG_CSEQ_STR(sequence.c_str()),
                                        TAG_IF(hasSession, SIPTAG_CONTENT_TYPE_STR("application/sdp")),
                                        TAG_IF(hasSession, SIPTAG_PAYLOAD_STR(sessionDescription.c_str())), TAG_END());
}

void SipEndpoint::cancel(SipCause const& cause)
{
    if (m_invite.transaction == nullptr) // more digits are awaited
    {
        m_dialog = SipDialogState::OVER;
        return;
    }
    std::string const reason = cause.getReasonHeader(true);
    trace("-> CANCEL, Reason: " + reason);
    m_byeAfterAck = cause; // should it be answered all the same
    nta_outgoing_tcancel(m_invite.transaction, nullptr, nullptr, SIPTAG_REASON_STR(reason.c_str()), TAG_END());
    m_timer.start(m_interface.getConfiguration().t1x64);
}

void SipEndpoint::Invitation::forget()
{
    if (transaction == nullptr)
        return;
    nta_outgoing_bind(transaction, nullptr, nullptr);
    nta_outgoing_destroy(std::exchange(transaction, nullptr));
}
