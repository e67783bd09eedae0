// The calling side: the INVITE was received, the peer leg says how it is answered.
#include "sip/endpoint/SipEndpoint.h"

#include "host/EmergencyCall.h"
#include "media/tone/CauseTone.h"
#include "properties/CC_Cause.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/endpoint/SipRules.h"
#include "sip/message/SipDiversion.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

using namespace SipProperty;

namespace
{
constexpr unsigned long LONGEST_EXPIRY = 86400; // seconds; a longer one is as good as none

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
        stepBack();
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
