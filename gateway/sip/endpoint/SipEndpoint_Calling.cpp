// The calling side: the INVITE was received, the peer leg says how it is answered.
#include "sip/endpoint/SipEndpoint.h"

#include "host/EmergencyCall.h"
#include "media/tone/CauseTone.h"
#include "properties/CC_Cause.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCallProgressTone.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/endpoint/SipRules.h"
#include "sip/message/SipContent.h"
#include "sip/message/SipDiversion.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <cstring>
#include <tuple>
#include <utility>

using namespace SipProperty;

namespace
{
constexpr unsigned long LONGEST_EXPIRY = 86400; // seconds; a longer one is as good as none
constexpr unsigned int LONGEST_SILENCE = 60000; // milliseconds
constexpr unsigned int MOST_FORKS = 32;

/// What the INVITE tells of its side beyond the party that calls.
void ADD_CALLING(CC_PropertyContainer& own, SipParty const& second, sip_t const* request, bool hasSession,
                 bool isTrusted, std::vector<SipRedirection> const& redirections)
{
    if (!second.number.empty())
        second.addAsSecondTo(own);
    SipDiversion diversion = SipDiversion::READ(request);
    if (!isTrusted)
        diversion.screening = QScreeningIndicator::USER_PROVIDED_NOT_SCREENED; // whatever it says
    for (SipRedirection const& redirection : redirections)
        diversion.add(redirection.from, 1, redirection.isWithheld);
    diversion.addTo(own);
    ADD(own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, hasSession)); // else a new leg's: none
}
} // namespace

int SipEndpoint::receiveInvite(nta_incoming_t* transaction, sip_t const* request, SipIdentity const& caller,
                               RouteHunt const& routes, std::string const& user)
{
    m_isCalling = true;
    m_isInCall = true;
    try
    {
        m_caller = caller;
        m_routes = routes;
        m_user = user;
        return takeInvite(transaction, request);
    }
    catch (std::bad_alloc const&)
    {
        if (m_transaction != nullptr)
        {
            failDialLater(QCause::NETWORK_OUT_OF_ORDER);
            return 0;
        }
        m_dialog = SipDialogState::OVER;
        leaveCall({QCause::RESOURCE_UNAVAILABLE, 503, {}});
        return 503;
    }
}

int SipEndpoint::takeInvite(nta_incoming_t* transaction, sip_t const* request)
{
    m_ladder = m_interface.getEnvironment().host.trace.begin(m_callNumber, m_interface.getConfiguration().name,
                                                             m_routes.getProvider());
    trace("<- INVITE to " + SipIdentity::READ_CALLED(request).getUser());
    noteAllow(request);
    if (takeTimer(transaction, request) != 0)
    {
        m_dialog = SipDialogState::OVER;
        leaveCall({QCause::INTERWORKING, 422, {}});
        return 422;
    }
    if (m_session.check(SESSION_OF(request)) != 0)
        return refuseSession(transaction);
    noteAccept(request);
    m_wantsReliable = sip_has_feature(request->sip_require, "100rel") != 0;
    m_allowsReliable = m_wantsReliable || sip_has_feature(request->sip_supported, "100rel") != 0;
    if (!makeServerDialog(transaction, request))
    {
        m_dialog = SipDialogState::OVER;
        leaveCall({QCause::RESOURCE_UNAVAILABLE, 503, {}});
        return 503;
    }
    nta_incoming_treply(transaction, SIP_100_TRYING, TAG_END());
    trace("-> 100");
    startExpiry(request);
    std::string const session = SESSION_OF(request);
    m_hasOffer = !session.empty();
    m_called = SipIdentity::READ_CALLED(request);
    if (isOverlapping())
    {
        m_firstOffer = session;
        awaitDigits();
    }
    noteSession(SipOfferAnswer::RECEIVED, SipOfferAnswer::INVITE, session);
    if (!dial(request, nullptr).isOk())
        failDialLater(QCause::NETWORK_OUT_OF_ORDER);
    else if (!m_session.open())
        failDialLater(QCause::RESOURCE_UNAVAILABLE);
    return 0;
}

/// It offers nothing that could be understood on its own interface.
int SipEndpoint::refuseSession(nta_incoming_t* transaction)
{
    SipCause const cause{QCause::INCOMPATIBLE_DESTINATION, 488, {}};
    trace("-> 488");
    nta_incoming_treply(transaction, SIP_488_NOT_ACCEPTABLE, SIPTAG_REASON_STR(cause.getReasonHeader(false).c_str()),
                        TAG_END());
    m_dialog = SipDialogState::OVER;
    leaveCall(cause);
    return 488;
}

/// RFC 3261, 13.3.1: who calls wants no answer after that time.
void SipEndpoint::startExpiry(sip_t const* request)
{
    sip_expires_t const* const expires = request->sip_expires;
    if (expires != nullptr && expires->ex_date == 0 && expires->ex_delta <= LONGEST_EXPIRY)
        m_timer.start(static_cast<unsigned int>(expires->ex_delta) * 1000);
}

/// Who has handed us the transaction still holds it, and it must not end under him.
void SipEndpoint::failDialLater(QCause cause)
{
    m_dialFailure = cause;
    m_timer.start(0);
}

void SipEndpoint::onCallingTimer()
{
    if (m_dialFailure != QCause::NONE)
    {
        clear({m_dialFailure, m_dialFailure == QCause::INCOMPATIBLE_DESTINATION ? 488u : 0u, {}});
        return;
    }
    if (m_failure)
        endByTone();
    if (m_dialog != SipDialogState::INVITE_RECEIVED)
        return;
    trace("the INVITE has expired");
    SipCause const cause{QCause::NO_ANSWER_FROM_USER, 487, {}};
    answerFinally(487, cause.getReasonHeader(false));
    leaveCall(cause);
}

bool SipEndpoint::makeServerDialog(nta_incoming_t* transaction, sip_t const* request)
{
    m_leg = nta_leg_tcreate(m_interface.getAgent(), HANDLE, this, SIPTAG_CALL_ID(request->sip_call_id),
                            SIPTAG_FROM(request->sip_to), SIPTAG_TO(request->sip_from), TAG_END());
    if (m_leg == nullptr)
        return false;
    nta_leg_tag(m_leg, nta_incoming_tag(transaction, nullptr));
    routeAsServer(m_leg, transaction, request);
    m_transaction = transaction;
    nta_incoming_bind(transaction, HANDLE_ACK_OR_CANCEL, this);
    advance(SipDialogState::INVITE_IN);
    m_way = SipRules::WAY_OF(request);
    return true;
}

XCode SipEndpoint::dial(sip_t const* request, MG_IContext* datapathContext)
{
    std::string const& provider = m_routes.getProvider();
    SipParty const called = m_routes.isNumberShaped() ? SipParty::OF_USER(m_routes.getNumber()) : m_called;
    SipIdentity const& caller = m_caller;
    CC_PropertyContainer own;
    ADD_CALLING(own, caller.second, request, m_hasOffer, m_interface.getConfiguration().isTrusted, m_redirections);
    addCarried(own, request);
    if (m_hasOffer)
        m_session.addOffer(own, SESSION_OF(request));
    CC_PropertyContainer offer;
    ADD(offer,
        CC_PropertyUnsigned(SipPropertyId::MAX_FORWARDS, SipRules::MAX_FORWARDS_AFTER(request))); // else the default
    if (request->sip_request->rq_url->url_type == url_sips)
        ADD(offer, CC_PropertyBoolean(SipPropertyId::SECURED, true));
    CC_PropertyContainer call;
    ADD(call, CC_PropertyUnsigned(SipPropertyId::CALL_NUMBER, m_callNumber)); // for logs alone
    if (m_routes.isEmergency())
        ADD(call, CC_PropertyBoolean(EmergencyCall::PROPERTY, true));
    if (isTraced())
        trace("did  dial " + provider + " (" + called.getUser() + ") as " + caller.party.getText() +
              ", State=CONNECTED, " + TEXT_OF(own));
    String name;
    name.format("%u", m_callNumber);
    if (XCode const bound = m_adapter.setup(name, *this, this); !bound.isOk())
        return bound;
    SipParty const& party = caller.party;
    return m_adapter.dial(m_interface.getEnvironment().host.contextName, provider.c_str(), STRING(called.getUser()),
                          STRING(party.number), party.type, party.plan, party.presentation, party.screening,
                          STRING(party.name), STRING(called.number), called.type, called.plan, STRING(called.name),
                          !isOverlapping(), m_session.getCapability(), datapathContext, &own, &offer, &call);
}

/// Nobody was reached, and our peer has heard nothing.
bool SipEndpoint::tryNextRoute(SipCause const& cause)
{
    if (!m_isCalling || m_dialog != SipDialogState::INVITE_RECEIVED || m_hasRung || m_hasEarlyMedia || m_fork != 0 ||
        m_dialFailure != QCause::NONE || !m_routes.goOn(static_cast<unsigned int>(cause.cause)))
        return false;
    dialAgain(cause, "the next route");
    return true;
}

/// A caller who has no tones of his own is told of the failure by ours before his INVITE is.
bool SipEndpoint::tellByTone(SipCause const& cause)
{
    unsigned int const seconds = m_interface.getConfiguration().failureTone;
    MG_Tones::ECallProgressTone::Type const tone = CauseTone::OF(cause.cause);
    if (!m_isCalling || m_dialog != SipDialogState::INVITE_RECEIVED || seconds == 0 || !m_hasOffer ||
        tone == MG_Tones::ECallProgressTone::NONE || !m_interface.getEnvironment().host.relaysMedia)
        return false;
    std::string const session = m_session.readForInvite(true);
    if (!m_session.playTone(tone))
        return false;
    m_failure = cause;
    trace("plays a tone for the cause " + std::to_string(static_cast<int>(cause.cause)));
    if (!isAgreedEarly() && m_earlySession.empty())
    {
        m_earlySession = session;
        answerProvisionally(SIP_183_SESSION_PROGRESS);
    }
    m_timer.start(seconds * 1000);
    return true;
}

void SipEndpoint::endByTone()
{
    SipCause const cause = *m_failure;
    endDialog(cause);
    leaveCall(cause);
}

int SipEndpoint::HANDLE_ACK_OR_CANCEL(SipEndpoint* endpoint, nta_incoming_t*, sip_t const* request)
{
    endpoint->handle(
        [&]
        {
            if (request == nullptr)
                endpoint->onAckMissing();
            else if (request->sip_request->rq_method == sip_method_cancel)
                endpoint->onCancel(request);
            else
                endpoint->onAck(request);
        });
    return 0;
}

void SipEndpoint::onAck(sip_t const* request)
{
    if (advance(SipDialogState::ACK_IN) == SipDialogState::IGNORE)
        return;
    forgetTransaction(); // it would live on for half a minute
    trace("<- ACK");
    forgetSetUp();
    startSessionTimer();
    if (!m_hasOffer && m_isInCall)
        takeAnswerOfAck(request);
    if (m_byeAfterAck)
        endDialog(*m_byeAfterAck);
    else
    {
        sendWaitingOffer();
        tellTariff(); // and what else waits
    }
}

void SipEndpoint::onAckMissing()
{
    if (m_dialog == SipDialogState::INVITE_RECEIVED) // nor did a PRACK
        clear({QCause::RECOVERY_ON_TIMER_EXPIRY, 504, {}});
    if (advance(SipDialogState::ACK_MISSING) == SipDialogState::IGNORE)
        return;
    forgetTransaction();
    trace("the 200 was not acknowledged");
    SipCause const cause = m_byeAfterAck.value_or(SipCause{QCause::RECOVERY_ON_TIMER_EXPIRY, 0, {}});
    sendBye(cause);
    leaveCall(cause);
}

void SipEndpoint::onCancel(sip_t const* request)
{
    if (advance(SipDialogState::CANCEL_IN) == SipDialogState::IGNORE)
        return; // answered already: the BYE will follow
    trace("<- CANCEL");
    SipCause const cause = SipCause::FROM_REQUEST(REASON_OF(request));
    answerFinally(487, {});
    leaveCall(cause);
}

/// Brings the INVITE's answers up to where the peer leg has come.
void SipEndpoint::followPeer()
{
    auto const* const state = getPeer<CC_PropertyCallLegState>(CC_PropertyId::STATE);
    if (state == nullptr)
        return;
    m_hadPeer = true;
    auto const* const data = getPeer<CC_PropertyBoolean>(CC_PropertyId::PROVIDES_DATA);
    auto const* const fork = getPeer<CC_PropertyUnsigned>(SipPropertyId::FORK);
    bool const isRungBack = isToRingBack();
    bool const hasData = (data != nullptr && data->getValue()) || isRungBack;
    unsigned int const number = fork != nullptr ? static_cast<unsigned int>(fork->getValue()) : 0;
    bool const isNews = number != m_fork; // of another party
    if (isNews)
    {
        useFork(number);
        m_hasRung = m_hasEarlyMedia = false;
        m_session.meetFork();
        m_negotiation = SipOfferAnswer(); // with this party nothing is agreed on
        if (m_hasOffer)
            m_negotiation.note(SipOfferAnswer::RECEIVED, SipOfferAnswer::INVITE);
        else
            m_negotiation.noteOfferlessInvite();
    }
    if (state->getState() >= CC_PropertyCallLegState::HELD)
    {
        answer();
        return;
    }
    bool isNewSession = false;
    if (!isAgreedEarly()) // else what is new comes with UPDATE
    {
        std::string session = hasData && m_hasOffer ? m_session.readForInvite(true) : std::string();
        isNewSession = session != m_earlySession;
        m_earlySession = std::move(session);
    }
    bool const hadEarlyMedia = std::exchange(m_hasEarlyMedia, m_hasEarlyMedia || hasData);
    if (state->getState() == CC_PropertyCallLegState::ALERTING && !std::exchange(m_hasRung, true))
        isRungBack ? answerProvisionally(SIP_183_SESSION_PROGRESS) : answerProvisionally(SIP_180_RINGING);
    else if (hasData && (!hadEarlyMedia || isNewSession))
        answerProvisionally(SIP_183_SESSION_PROGRESS);
}

/// Whether our peer is to hear a tone of ours meanwhile.
bool SipEndpoint::isToRingBack() const
{
    auto const* const tone = getPeer<CC_PropertyCallProgressTone>(CC_PropertyId::CALL_PROGRESS_TONE);
    return tone != nullptr && tone->getTone() != MG_Tones::ECallProgressTone::NONE && m_hasOffer &&
           m_interface.getConfiguration().ringsBack && m_interface.getEnvironment().host.relaysMedia;
}

void SipEndpoint::answerProvisionally(int status, char const* phrase)
{
    m_provisional = status;
    if (!answerReliably(status, phrase, m_earlySession))
        answerFromPeer(status, phrase, isAgreedEarly() ? std::string() : m_earlySession);
    unsigned int const interval = 120 * m_interface.getConfiguration().t1; // a minute, unless the network is a fast one
    m_offerTimer.start(std::min(interval, LONGEST_SILENCE));
}

// Reliable provisional responses (RFC 3262): when the caller insists, or understands them and the answer is binding.

/// Whether it is sent so, or must not be sent at all.
bool SipEndpoint::answerReliably(int status, char const* phrase, std::string const& session)
{
    bool const isAnswer = !session.empty() && !isAgreedEarly() && m_session.isAnswerBinding();
    if (m_wantsReliable && !m_hasOffer)
        return true; // it would have to bear an offer, which nobody has made
    if (!m_wantsReliable && !(m_allowsReliable && isAnswer))
        return false;
    std::string const headers =
        SipIdentity::GET_ASSERTED(SipParty::OF_PEER(m_adapter), m_interface.getConfiguration().getAddress(),
                                  m_interface.getConfiguration().isTrusted) +
        getCarried(SipCarriedHeaders::RESPONSE);
    SipContent const content = SipContent::OF(isAnswer ? session : std::string(), getTariffForAnswer());
    nta_reliable_t const* const reliable = nta_reliable_treply(
        m_transaction, HANDLE_PRACK, this, status, phrase, SIPTAG_CONTACT_STR(getContact()),
        SIPTAG_ALLOW(m_interface.getAllow()), TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
        TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
        TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD_STR(content.body.c_str())), TAG_END());
    if (reliable == nullptr)
        return false;
    trace("-> " + std::to_string(status) + (isAnswer ? " with a session description" : "") + ", reliably");
    ++m_unacknowledged;
    if (!isAnswer)
        return true;
    noteSession(SipOfferAnswer::SENT, SipOfferAnswer::RELIABLE, session);
    m_ownSession = session;
    m_quality.noteAnswer(session);
    m_session.noteSettled();
    return true;
}

int SipEndpoint::HANDLE_PRACK(SipEndpoint* endpoint, nta_reliable_t* reliable, nta_incoming_t* transaction,
                              sip_t const* request)
{
    nta_reliable_destroy(reliable);
    int status = 200;
    if (request != nullptr) // else it never came; the INVITE's end is told apart
        endpoint->handle([&] { status = endpoint->onPrack(transaction, request); });
    return status;
}

int SipEndpoint::onPrack(nta_incoming_t* transaction, sip_t const* request)
{
    m_unacknowledged -= m_unacknowledged > 0;
    bool const hasOffer = !SESSION_OF(request).empty();
    trace(std::string("<- PRACK, -> ") + (hasOffer ? "488" : "200"));
    if (hasOffer) // it is acknowledged all the same; an UPDATE may offer
        nta_incoming_treply(transaction, SIP_488_NOT_ACCEPTABLE, TAG_END());
    sendWaitingOffer();
    return hasOffer ? 488 : 200;
}

/// So that no proxy on the way gives the call up (RFC 3261, 13.3.1.1).
void SipEndpoint::repeatProvisional() { answerProvisionally(m_provisional, nullptr); }

// A proxy of the called side may ask several parties at once. Each of them is a dialog of its own for the caller, with
// a tag of its own, until one has answered (RFC 3261, 12.1).

/// What is said from now on that one says, with the tag of its dialog.
void SipEndpoint::useFork(unsigned int fork)
{
    if (fork >= MOST_FORKS)
        return; // speaks as the one before
    if (m_otherLegs.size() <= std::max(fork, m_fork))
        m_otherLegs.resize(std::max(fork, m_fork) + 1);
    nta_leg_t* const leg = m_otherLegs[fork] != nullptr ? m_otherLegs[fork] : makeFork();
    if (leg == nullptr)
        return;
    m_otherLegs[fork] = nullptr;
    m_otherLegs[m_fork] = std::exchange(m_leg, leg);
    m_fork = fork;
    // The stack has one tag per INVITE, with which it answers and knows the ACK. All its tags are of one length.
    char const* const old = nta_incoming_gettag(m_transaction);
    char const* const tag = nta_leg_get_tag(m_leg);
    if (old != nullptr && std::strlen(old) == std::strlen(tag))
        std::copy_n(tag, std::strlen(tag), const_cast<char*>(old));
}

nta_leg_t* SipEndpoint::makeFork()
{
    SipHeldMessage const message(nta_incoming_getrequest(m_transaction));
    sip_t const* const request = sip_object(message.get());
    nta_leg_t* const leg = nta_leg_tcreate(m_interface.getAgent(), HANDLE, this, SIPTAG_CALL_ID(request->sip_call_id),
                                           SIPTAG_FROM(request->sip_to), SIPTAG_TO(request->sip_from), TAG_END());
    if (leg != nullptr)
    {
        nta_leg_tag(leg, nullptr);
        routeAsServer(leg, m_transaction, request);
    }
    return leg;
}

void SipEndpoint::answer()
{
    std::string const session = isAgreedEarly() ? std::string() : m_session.readForInvite(m_hasOffer);
    m_session.noteSettled();
    if (session.empty() && !m_session.isAgreed())
    {
        giveUp();
        return;
    }
    answerWith(session);
}

void SipEndpoint::answerWith(std::string const& session)
{
    if (!isAgreedEarly())
        noteSession(SipOfferAnswer::SENT, SipOfferAnswer::FINAL, session);
    m_offerTimer.stop();
    m_timer.stop();
    answerFromPeer(SIP_200_OK, session);
    advance(SipDialogState::ANSWER_OUT);
    if (unsigned int const longest = m_interface.getConfiguration().longestCall;
        longest != 0 && !m_routes.isEmergency())
        m_lengthTimer.start(longest * 1000);
    m_wasAnswered = true;
    ++m_interface.getEnvironment().host.counters.answered;
    if (std::string const number = std::exchange(m_transferAfterAnswer, {}); !number.empty())
        transferTo(number);
}

/// With the called party's identity, as far as the network vouches for it.
void SipEndpoint::answerFromPeer(int status, char const* phrase, std::string const& session)
{
    std::string const identity =
        SipIdentity::GET_ASSERTED(SipParty::OF_PEER(m_adapter), m_interface.getConfiguration().getAddress(),
                                  m_interface.getConfiguration().isTrusted);
    if (m_hasOffer)
        m_quality.noteAnswer(session);
    trace("-> " + std::to_string(status) + (session.empty() ? "" : " with a session description"));
    std::string const headers = identity + getCarried(SipCarriedHeaders::RESPONSE) +
                                (status >= 200 ? m_sessionTimer.getResponseHeaders() : std::string());
    if (status >= 200 && !session.empty())
        m_ownSession = session;
    SipContent const content = SipContent::OF(session, getTariffForAnswer());
    nta_incoming_treply(m_transaction, status, phrase, SIPTAG_CONTACT_STR(getContact()),
                        SIPTAG_ALLOW(m_interface.getAllow()), SIPTAG_SUPPORTED(m_interface.getSupported()),
                        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
                        TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
                        TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD_STR(content.body.c_str())), TAG_END());
}

void SipEndpoint::answerFinally(unsigned int status, std::string const& reasonHeader)
{
    trace("-> " + std::to_string(status) + (reasonHeader.empty() ? "" : ", Reason: ") + reasonHeader);
    std::string const headers = getCarried(SipCarriedHeaders::RESPONSE);
    nta_incoming_treply(m_transaction, static_cast<int>(status), nullptr,
                        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
                        TAG_IF(!reasonHeader.empty(), SIPTAG_REASON_STR(reasonHeader.c_str())), TAG_END());
    forgetTransaction(); // the stack goes on repeating the answer until its ACK
}

void SipEndpoint::forgetTransaction()
{
    if (m_transaction == nullptr)
        return;
    nta_incoming_bind(m_transaction, nullptr, nullptr);
    nta_incoming_destroy(std::exchange(m_transaction, nullptr));
}
