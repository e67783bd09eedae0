// Transfer: our peer asks for one (REFER), the other side's does, or another dialog takes the place of ours (Replaces).
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "services/CC_ServiceBlindTransfer.h"
#include "services/CC_ServiceBlindTransferStatus.h"
#include "services/CC_ServiceConferenceRefer.h"

#include <algorithm>
#include <strings.h>
#include <tuple>
#include <utility>

using namespace SipProperty;

namespace
{
constexpr char const* SIPFRAG = "message/sipfrag;version=2.0";
constexpr unsigned int PATIENCE = 4; // times T1, for a peer that was transferred to hang up by itself

/// "Replaces: ..." of an address's headers, as the dialog that it names; null without one.
sip_replaces_t* REPLACES_OF(su_home_t* home, url_t const& address)
{
    char const* const lines =
        address.url_headers != nullptr ? url_query_as_header_string(home, address.url_headers) : nullptr;
    constexpr std::string_view NAME = "replaces:";
    std::string_view rest = lines != nullptr ? lines : "";
    while (!rest.empty())
    {
        std::string_view const line = rest.substr(0, rest.find('\n'));
        if (line.size() > NAME.size() && strncasecmp(line.data(), NAME.data(), NAME.size()) == 0)
            return sip_replaces_make(home, std::string(line.substr(NAME.size())).c_str());
        rest.remove_prefix(std::min(rest.size(), line.size() + 1));
    }
    return nullptr;
}

/// "Referred-By: ..." and "Replaces: ..." for the INVITE that follows, each with its line break.
std::string HEADERS_FOR_TARGET(su_home_t* home, sip_t const* request, sip_replaces_t const* replaces)
{
    std::string headers;
    auto const add = [&](char const* name, sip_header_t const* header)
    {
        char const* const value = header != nullptr ? sip_header_as_string(home, header) : nullptr;
        if (value != nullptr)
            headers.append(name).append(value).append("\r\n");
    };
    add("Referred-By: ", reinterpret_cast<sip_header_t const*>(request->sip_referred_by));
    add("Replaces: ", reinterpret_cast<sip_header_t const*>(replaces));
    return headers;
}

/// The status of a NOTIFY's body ("SIP/2.0 200 OK"); 0 for anything else.
unsigned int STATUS_OF_FRAGMENT(std::string const& body)
{
    constexpr std::string_view BEGINNING = "SIP/2.0 ";
    if (body.size() < BEGINNING.size() + 3 || body.compare(0, BEGINNING.size(), BEGINNING) != 0)
        return 0;
    unsigned int status = 0;
    for (char const c : body.substr(BEGINNING.size(), 3))
        status = c >= '0' && c <= '9' ? status * 10 + static_cast<unsigned int>(c - '0') : 0;
    return status;
}
} // namespace

// --- our peer asks ---------------------------------------------------------------------------------------------------

int SipEndpoint::onRefer(nta_incoming_t* transaction, sip_t const* request)
{
    if (m_dialog != SipDialogState::UP || !m_isInCall)
        return 481;
    if (m_isReferring)
        return 491; // one after the other
    if (request->sip_refer_to == nullptr)
        return 400;
    SipHome const home(su_home_create());
    url_t const& target = *request->sip_refer_to->r_url;
    sip_replaces_t* const replaces = REPLACES_OF(home.get(), target);
    std::string const number = SipAddress::UNESCAPE_USER(target.url_user != nullptr ? target.url_user : "");
    trace("<- REFER to " + number + (replaces != nullptr ? ", replacing" : "") + ", -> 202");
    nta_incoming_treply(transaction, SIP_202_ACCEPTED, SIPTAG_CONTACT_STR(getContact()), TAG_END());
    m_isReferring = true;
    notifyReferrer(100, "Trying");
    SipEndpoint* other = replaces != nullptr ? m_interface.findDialog(replaces) : nullptr;
    if (other != nullptr && (other->m_dialog != SipDialogState::UP || !other->m_isInCall))
        other = nullptr;
    if (isInConference())
        callIn(number);
    else if (other != nullptr)
        joinCallOf(*other);
    else
        askPeerToTransfer(number, HEADERS_FOR_TARGET(home.get(), request, replaces));
    return 202;
}

/// Attended, and the dialog with the target is ours as well: the two other sides are joined.
void SipEndpoint::joinCallOf(SipEndpoint& other)
{
    XCode const result = m_adapter.transfer(other.m_adapter, true);
    trace(std::string("did  transfer, ") + (result.isOk() ? "joined" : "refused"));
    endReferral(result.isOk() ? QCause::NONE : QCause::TEMPORARY_FAILURE);
}

/// Another party is to come into the conference (RFC 4579, 5.5); its focus tells what becomes of it.
void SipEndpoint::callIn(std::string const& number)
{
    CC_ServiceConferenceRefer refer(STRING(number));
    trace("did  ask for " + number + " to be called in");
    m_timer.start((m_interface.getConfiguration().answerTimeout + 10) * 1000);
    m_adapter.invokeSynchronousService(refer);
}

void SipEndpoint::askPeerToTransfer(std::string const& number, std::string const& headers)
{
    std::ignore = m_adapter.setOwnProperty(CC_PropertyString(SipPropertyId::HEADERS_FOR_TARGET, STRING(headers)));
    CC_ServiceBlindTransfer transfer(String(), STRING(number));
    trace("did  ask for a transfer to " + number);
    m_timer.start((m_interface.getConfiguration().answerTimeout + 10) * 1000); // nobody need answer
    m_adapter.invokeSynchronousService(transfer);
}

void SipEndpoint::notifyReferrer(unsigned int status, char const* phrase)
{
    std::string const body = "SIP/2.0 " + std::to_string(status) + " " + phrase + "\r\n";
    trace("-> NOTIFY " + std::to_string(status));
    m_interface.getSender().sendAlone(
        m_leg, SIP_METHOD_NOTIFY, SIPTAG_EVENT_STR("refer"),
        SIPTAG_SUBSCRIPTION_STATE_STR(status < 200 ? "active;expires=180" : "terminated;reason=noresource"),
        SIPTAG_CONTACT_STR(getContact()), SIPTAG_CONTENT_TYPE_STR(SIPFRAG), SIPTAG_PAYLOAD_STR(body.c_str()),
        TAG_END());
}

/// NONE: the others have each other, and our peer hangs up, or is hung up on. Otherwise all is as it was.
void SipEndpoint::endReferral(QCause cause)
{
    if (!std::exchange(m_isReferring, false))
        return;
    m_timer.stop();
    unsigned int const status = cause == QCause::NONE ? 200 : SipCause::STATUS_OF_CAUSE(cause);
    if (m_dialog == SipDialogState::UP)
        notifyReferrer(status, cause == QCause::NONE ? "OK" : sip_status_phrase(static_cast<int>(status)));
    if (cause != QCause::NONE || isInConference())
        return;
    endOffers();
    m_timer.start(PATIENCE * m_interface.getConfiguration().t1);
    leaveCall({QCause::NORMAL_CALL_CLEARING, 0, {}});
}

/// No answer is repeated after this time; or who referred us is to be told something.
void SipEndpoint::onUpTimer()
{
    if (m_isReferring || !m_isInCall)
        onReferralTimeout();
    else if (m_lateAck != &m_invite)
        m_invite.forget();
}

void SipEndpoint::onReferralTimeout()
{
    if (!m_isInCall)
        endDialog({QCause::NORMAL_CALL_CLEARING, 0, {}});
    else
        endReferral(QCause::RECOVERY_ON_TIMER_EXPIRY);
}

// --- the other side's peer asks --------------------------------------------------------------------------------------

void SipEndpoint::tellTransferStatus(QCause cause)
{
    trace(std::string("did  tell the status of the transfer, cause ") + std::to_string(static_cast<int>(cause)));
    CC_ServiceBlindTransferStatus status(cause);
    m_adapter.invokeSynchronousService(status);
}

void SipEndpoint::onBlindTransfer(CC_ServiceBlindTransfer const& transfer)
{
    std::string const number(transfer.getNumber().view());
    trace("told transfer to " + number);
    bool const isUp = m_dialog == SipDialogState::UP || m_dialog == SipDialogState::ANSWERED; // its ACK is on the way
    if (m_dialog == SipDialogState::INVITE_RECEIVED && m_transferAfterAnswer.empty())
        m_transferAfterAnswer = number; // a service is heard at once, the other side's answer in the loop's next turn
    else if (!isUp || m_isTransferring)
        tellTransferStatus(QCause::TEMPORARY_FAILURE);
    else
        transferTo(number);
}

void SipEndpoint::transferTo(std::string const& number)
{
    if (m_interface.getConfiguration().transfersOnWire)
        refer(number);
    else
        dialTarget(number);
}

/// With a leg of its own; ours joins it once the target has answered.
void SipEndpoint::dialTarget(std::string const& number)
{
    SipEnvironment& environment = m_interface.getEnvironment();
    m_targetRoutes = environment.host.findRoutes(m_interface.getConfiguration().name, number,
                                                 SipProperty::TEXT_OF(m_adapter.getOwnE164()), m_callNumber, m_user);
    RouteHunt const& routes = m_targetRoutes;
    if (routes.isEmpty() || environment.host.isEnding)
    {
        tellTransferStatus(QCause::NO_ROUTE_TO_DESTINATION);
        return;
    }
    if (m_target == nullptr)
        m_target = std::make_unique<CC_CallAdapterE164>();
    SipParty const called = SipParty::OF_USER(routes.getNumber());
    CC_PropertyContainer own; // of the leg that stands for our peer until ours joins
    if (CC_Property const* const codecs = m_adapter.getOwnProperty(CC_PropertyId::SUPPORTED_CODECS))
        ADD(own, *codecs);
    CC_PropertyContainer offer;
    if (auto const* const headers = getPeer<CC_PropertyString>(SipPropertyId::HEADERS_FOR_TARGET))
        ADD(offer, *headers);
    CC_PropertyContainer call;
    ADD(call, CC_PropertyUnsigned(SipPropertyId::CALL_NUMBER, ++environment.host.lastCallNumber));
    String name;
    name.format("%u-transfer", m_callNumber);
    m_isTransferring = true;
    m_hasTarget = false;
    trace("did  dial " + routes.getProvider() + " (" + called.getUser() + ") for the transfer");
    if (m_target->setup(name, *this, this).isOk() &&
        m_target
            ->dial(environment.host.contextName, routes.getProvider().c_str(), STRING(called.getUser()),
                   m_adapter.getOwnE164(), m_adapter.getOwnTypeOfNumber(), m_adapter.getOwnNumberingPlan(),
                   m_adapter.getOwnPresentationIndicator(), m_adapter.getOwnScreeningIndicator(),
                   m_adapter.getOwnName(), STRING(called.number), called.type, called.plan, String(), true,
                   QInformationTransferCapability::SPEECH, nullptr, &own, &offer, &call)
            .isOk())
        return;
    endTransfer(QCause::NETWORK_OUT_OF_ORDER);
}

void SipEndpoint::followTarget()
{
    if (!m_isTransferring || m_target == nullptr)
        return;
    auto const* const state = CC_PropertyCallLegState::FROM(m_target->getPeerProperty(CC_PropertyId::STATE));
    bool const hadTarget = std::exchange(m_hasTarget, state != nullptr);
    if (state != nullptr && state->getState() >= CC_PropertyCallLegState::HELD)
        joinTarget();
    else if (state != nullptr ? state->getState() == CC_PropertyCallLegState::RELEASED : hadTarget)
        endTransfer(SipCause::FROM_PROPERTY(CC_PropertyCause::FROM(m_target->getPeerCauseProperty())).cause);
}

/// The target has offered in its answer to an INVITE without a description; our peer is to be offered that.
void SipEndpoint::joinTarget()
{
    m_isTransferring = false;
    m_session.expectOffer();
    tellTransferStatus(QCause::NONE); // who asked leaves
    XCode const result = m_adapter.transfer(*m_target, false);
    trace(std::string("did  transfer, ") + (result.isOk() ? "joined" : "refused"));
    m_target->drop(QCause::NORMAL_CALL_CLEARING, 0);
    if (!result.isOk())
        clear({QCause::TEMPORARY_FAILURE, 0, {}});
}

/// It failed: our peer and the other side still have each other, unless the other side has gone meanwhile.
void SipEndpoint::endTransfer(QCause cause)
{
    m_isTransferring = false;
    if (m_target != nullptr)
        m_target->drop(cause, 0);
    tellTransferStatus(cause);
    if (isPeerReleased())
        clear({cause, 0, {}});
}

/// On the wire: our peer calls the target by itself.
void SipEndpoint::refer(std::string const& number)
{
    SipConfiguration const& configuration = m_interface.getConfiguration();
    std::string const uri = SipAddress::MAKE_URI(number,
                                                 !m_peers.empty()          ? getPeerAddress()
                                                 : configuration.hasPeer() ? configuration.peer
                                                                           : configuration.getAddress(m_way),
                                                 m_way);
    std::string const self = SipAddress::MAKE_URI("gateway", configuration.getAddress(m_way), m_way);
    trace("-> REFER to " + uri);
    m_isTransferring = true;
    m_refer = m_interface.getSender().send(
        m_leg, HANDLE_REFER_RESPONSE, this, SIP_METHOD_REFER, nullptr, SIPTAG_REFER_TO_STR(("<" + uri + ">").c_str()),
        SIPTAG_REFERRED_BY_STR(("<" + self + ">").c_str()), SIPTAG_CONTACT_STR(getContact()), TAG_END());
    if (m_refer == nullptr)
        endTransfer(QCause::RESOURCE_UNAVAILABLE);
}

int SipEndpoint::HANDLE_REFER_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response)
{
    int const status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(transaction);
    if (status < 200)
        return 0;
    if (endpoint->authenticate(endpoint->m_refer, response, endpoint->m_leg, HANDLE_REFER_RESPONSE))
        return 0;
    nta_outgoing_destroy(std::exchange(endpoint->m_refer, nullptr));
    if (status >= 300 && endpoint->m_isTransferring)
        endpoint->handle([&] { endpoint->endTransfer(SipCause::CAUSE_OF_STATUS(static_cast<unsigned int>(status))); });
    return 0;
}

int SipEndpoint::onNotify(sip_t const* request)
{
    bool const isOfReferral = request->sip_event != nullptr && strcasecmp(request->sip_event->o_type, "refer") == 0;
    if (isOfReferral && m_hasSteppedBack && !m_isTransferring)
        return 200; // what becomes of it shows: the other side's peer hangs up, or all stays as it is
    if (!isOfReferral || !m_isTransferring || m_target != nullptr)
        return 481;
    unsigned int const status = STATUS_OF_FRAGMENT(SipBody::PAYLOAD_OF(request));
    bool const isOver = request->sip_subscription_state != nullptr &&
                        strcasecmp(request->sip_subscription_state->ss_substate, "terminated") == 0;
    trace("<- NOTIFY " + std::to_string(status) + ", -> 200");
    if (status >= 300 || (isOver && status < 200))
        endTransfer(SipCause::CAUSE_OF_STATUS(status >= 300 ? status : 500));
    else if (status >= 200)
    {
        m_isTransferring = false;
        tellTransferStatus(QCause::NONE);
    }
    return 200;
}

// --- another dialog takes the place of ours (RFC 3891) ---------------------------------------------------------------

/// RFC 3891, 3. A dialog that is not up yet can be replaced if it is we who call, and if media are ours: else there are
/// two offers, of the caller and of who takes the place, and nobody to answer them.
int SipEndpoint::checkReplaces(sip_replaces_t const& replaces) const
{
    switch (m_dialog)
    {
    case SipDialogState::UP:
    case SipDialogState::ANSWERED:
        if (replaces.rp_early_only)
            return 486;
        return m_dialog == SipDialogState::UP && m_isInCall ? 0 : 481;
    case SipDialogState::INVITE_SENT:
    {
        bool const isKnown = std::any_of(m_forks.begin(), m_forks.end(),
                                         [&](Fork const& fork) { return fork.tag == replaces.rp_from_tag; });
        if (!isKnown || !m_isInCall)
            return 481;
        return m_interface.getEnvironment().host.relaysMedia ? 0 : 488;
    }
    case SipDialogState::CANCELLED:
    case SipDialogState::BYE_SENT:
    case SipDialogState::OVER:
        return 603;
    default:
        return 481;
    }
}

int SipEndpoint::receiveReplacing(nta_incoming_t* transaction, sip_t const* request, SipEndpoint& replaced)
{
    m_isCalling = true;
    m_isReplacing = true;
    m_ladder = m_interface.getEnvironment().host.trace.find(replaced.m_callNumber);
    trace("<- INVITE with Replaces");
    if (!makeServerDialog(transaction, request))
    {
        m_dialog = SipDialogState::OVER;
        leaveCall({QCause::RESOURCE_UNAVAILABLE, 503, {}});
        return 503;
    }
    nta_incoming_treply(transaction, SIP_100_TRYING, TAG_END());
    if (!takePlaceOf(replaced, request).isOk())
        m_timer.start(0); // once the stack has let go of the transaction
    return 0;
}

XCode SipEndpoint::takePlaceOf(SipEndpoint& replaced, sip_t const* request)
{
    CC_Call* const call = replaced.m_adapter.getCall();
    if (call == nullptr)
        return XCode::FAILURE;
    SipParty const party = SipIdentity::READ_CALLER(request, m_interface.getConfiguration().isTrusted).party;
    String name;
    name.format("%u", m_callNumber);
    if (XCode const bound = m_adapter.setup(name, *this, this); !bound.isOk())
        return bound;
    if (XCode const accepted = m_adapter.accept(*call, STRING(party.number), party.type, party.plan, party.presentation,
                                                party.screening, STRING(party.name));
        !accepted.isOk())
        return accepted;
    m_isInCall = true;
    replaced.clear({QCause::NORMAL_CALL_CLEARING, 200, "Replaced"});
    CC_PropertyContainer own;
    ADD(own, CC_PropertyCallLegState(CC_PropertyId::STATE, CC_PropertyCallLegState::CONNECTED));
    if (XCode const written = writeOwn(own); !written.isOk())
        return written;
    m_session.follow(false); // meets the other side
    std::string const session = SESSION_OF(request);
    m_hasOffer = !session.empty();
    noteSession(SipOfferAnswer::RECEIVED, SipOfferAnswer::INVITE, session);
    if (m_session.takeOffer(session, false) != 0)
        failDialLater(QCause::INCOMPATIBLE_DESTINATION);
    m_session.proceed();
    return XCode::OK;
}
