// Sessions of a dialog that is up: re-INVITE and UPDATE, either way.
#include "sip/dialog/SipDescription.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/endpoint/SipRules.h"

#include <spdlog/spdlog.h>

#include "sip/message/SipProperty.h"

#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"

#include <sofia-sip/su_uniqueid.h>
#include <tuple>
#include <utility>

using namespace SipProperty;

namespace
{
constexpr unsigned int MOST_REFUSALS = 5; // 491 to one offer of ours: then the peer is at odds with itself

/// Who made the Call-ID waits for longer, so that the two do not meet again (RFC 3261, 14.1). Milliseconds.
unsigned int RETRY_DELAY(bool isOwnerOfCallId)
{
    int const steps = isOwnerOfCallId ? su_randint(210, 400) : su_randint(0, 200);
    return static_cast<unsigned int>(steps) * 10;
}

/// What is between us and our peer alone means nothing to the other side's.
unsigned int REFUSAL_FOR_OTHER_SIDE(unsigned int status)
{
    switch (status)
    {
    case 488:
    case 491:
    case 500:
    case 504:
    case 606:
        return status;
    default:
        return status < 500 ? 488 : 500;
    }
}
} // namespace

void SipEndpoint::noteSession(SipOfferAnswer::Direction direction, SipOfferAnswer::Carrier carrier,
                              std::string const& session)
{
    if (!session.empty())
        m_negotiation.note(direction, carrier);
    else if (carrier == SipOfferAnswer::INVITE)
        m_negotiation.noteOfferlessInvite();
    else if (carrier == SipOfferAnswer::FINAL || carrier == SipOfferAnswer::ACK)
        m_negotiation.fail(); // a peer that agrees on nothing
}

/// Nothing can be understood across, or our peer has agreed to nothing.
void SipEndpoint::giveUp() { clear({QCause::INCOMPATIBLE_DESTINATION, 488, {}}); }

void SipEndpoint::onSilence(unsigned int seconds)
{
    handle(
        [&]
        {
            spdlog::info("call {} {} ({} side): nothing was heard for {} s", m_callNumber, getName().view(),
                         m_isCalling ? "calling" : "called", seconds);
            clear({QCause::TEMPORARY_FAILURE, 0, {}});
        });
}

// --- theirs ----------------------------------------------------------------------------------------------------------

int SipEndpoint::onOffer(nta_incoming_t* transaction, sip_t const* request)
{
    bool const isUpdate = request->sip_request->rq_method == sip_method_update;
    std::string const session = SESSION_OF(request);
    trace(std::string("<- ") + request->sip_request->rq_method_name + " in the dialog" +
          (session.empty() ? "" : " with a session description"));
    int status = checkOffer(transaction, request);
    if (status == 0)
    {
        routeAsServer(m_leg, transaction, request);
        status = takeOffer(transaction, session, isUpdate);
    }
    if (status != 0)
        trace("-> " + std::to_string(status));
    return status;
}

int SipEndpoint::checkOffer(nta_incoming_t* transaction, sip_t const* request)
{
    bool const isEarly = m_dialog == SipDialogState::INVITE_RECEIVED || m_dialog == SipDialogState::INVITE_SENT;
    if (isEarly && request->sip_request->rq_method == sip_method_invite)
        return 491;
    if (isEarly ? !isAgreedEarly() : m_dialog != SipDialogState::UP && m_dialog != SipDialogState::ANSWERED)
        return isEarly ? 491 : 481;
    if (int const refused = SipRules::CHECK_BODY(transaction, request, m_interface.getConfiguration().carriesIsup);
        refused != 0)
        return refused;
    if (int const refused = takeTimer(transaction, request); refused != 0)
        return refused;
    unsigned int const refusal = getOfferRefusal();
    if (refusal == 500)
    {
        std::string const seconds = std::to_string(su_randint(0, 10)); // RFC 3261, 14.2
        nta_incoming_treply(transaction, SIP_500_INTERNAL_SERVER_ERROR, SIPTAG_RETRY_AFTER_STR(seconds.c_str()),
                            TAG_END());
    }
    return static_cast<int>(refusal);
}

/// Whether a reliable provisional response has settled the session before the call is up: then an UPDATE may change it.
bool SipEndpoint::isAgreedEarly() const
{
    bool const isEarly = m_dialog == SipDialogState::INVITE_RECEIVED || m_dialog == SipDialogState::INVITE_SENT;
    return isEarly && m_negotiation.hasAgreed();
}

/// An offer of theirs beside one of ours is glare, beside another of theirs too early.
unsigned int SipEndpoint::getOfferRefusal() const
{
    if (m_isOffering || m_lateAck != nullptr || m_isOfferWaiting || m_dialog == SipDialogState::ANSWERED)
        return 491;
    return m_offerReceived != nullptr ? 500 : m_negotiation.getRefusal();
}

int SipEndpoint::takeOffer(nta_incoming_t* transaction, std::string const& description, bool isUpdate)
{
    if (isUpdate && description.empty())
    {
        std::string const headers = m_sessionTimer.getResponseHeaders();
        nta_incoming_treply(transaction, SIP_200_OK, SIPTAG_CONTACT_STR(getContact()),
                            TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())), TAG_END());
        startSessionTimer();
        return 200;
    }
    if (!m_isInCall)
        return 481;
    unsigned int const refusal = m_session.takeOffer(description, isUpdate);
    if (refusal != 0)
        return static_cast<int>(refusal);
    noteSession(SipOfferAnswer::RECEIVED, isUpdate ? SipOfferAnswer::UPDATE : SipOfferAnswer::INVITE, description);
    m_isHeldByOffer = description.empty() ? m_isHeld : SipDescription::IS_HOLD(description);
    m_offerReceived = transaction;
    m_isOfferAnswered = false;
    nta_incoming_bind(transaction, HANDLE_ACK_OR_CANCEL_OF_OFFER, this);
    unsigned int const patience = m_interface.getConfiguration().t1x64;
    m_offerTimer.start(isUpdate ? patience / 2 : patience * 2);
    if (!isUpdate)
        nta_incoming_treply(transaction, SIP_100_TRYING, TAG_END());
    m_session.proceed();
    return 0;
}

void SipEndpoint::sendAnswer(std::string const& description)
{
    if (m_lateAck != nullptr)
    {
        noteSession(SipOfferAnswer::SENT, SipOfferAnswer::ACK, description);
        m_quality.noteAnswer(description);
        acknowledge(*m_lateAck, description);
        followHold();
        return;
    }
    if (m_dialog == SipDialogState::INVITE_RECEIVED && m_isReplacing)
    {
        answerWith(description);
        return;
    }
    if (m_offerReceived == nullptr || m_isOfferAnswered)
        return;
    bool const isUpdate = nta_incoming_method(m_offerReceived) == sip_method_update;
    bool const isAnswer = m_negotiation.getState() == SipOfferAnswer::THEIRS;
    noteSession(SipOfferAnswer::SENT, isUpdate ? SipOfferAnswer::UPDATE_OK : SipOfferAnswer::FINAL, description);
    if (isAnswer)
        m_quality.noteAnswer(description);
    m_offerTimer.stop();
    trace("-> 200 with a session description");
    m_isOfferAnswered = !isUpdate;
    m_ownSession = description;
    std::string const headers = m_sessionTimer.getResponseHeaders();
    startSessionTimer();
    nta_incoming_treply(m_offerReceived, SIP_200_OK, SIPTAG_CONTACT_STR(getContact()),
                        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
                        SIPTAG_CONTENT_TYPE_STR("application/sdp"), SIPTAG_PAYLOAD_STR(description.c_str()), TAG_END());
    if (isUpdate)
        forgetOffer();
    followHold();
}

void SipEndpoint::sendRefusal(unsigned int status)
{
    if (m_dialog == SipDialogState::INVITE_RECEIVED && m_isReplacing)
        clear({SipCause::CAUSE_OF_STATUS(status), status, {}});
    if (m_lateAck == nullptr)
    {
        refuseOffer(status);
        return;
    }
    bool const isFirst = m_lateAck == &m_invite;
    m_negotiation.fail();
    acknowledge(*m_lateAck, SipDescription::REFUSING(m_offerOfPeer));
    if (isFirst)
        clear({SipCause::CAUSE_OF_STATUS(status), status, {}}); // nothing was ever agreed on
}

void SipEndpoint::refuseOffer(unsigned int status)
{
    if (m_offerReceived == nullptr || m_isOfferAnswered)
        return;
    trace("-> " + std::to_string(status) + " to the offer");
    m_negotiation.fail();
    m_offerTimer.stop();
    nta_incoming_treply(m_offerReceived, static_cast<int>(status), nullptr, TAG_END());
    forgetOffer();
}

void SipEndpoint::forgetOffer()
{
    m_isOfferAnswered = false;
    if (m_offerReceived == nullptr)
        return;
    nta_incoming_bind(m_offerReceived, nullptr, nullptr);
    nta_incoming_destroy(std::exchange(m_offerReceived, nullptr));
}

int SipEndpoint::HANDLE_ACK_OR_CANCEL_OF_OFFER(SipEndpoint* endpoint, nta_incoming_t*, sip_t const* request)
{
    endpoint->handle(
        [&]
        {
            if (request != nullptr && request->sip_request->rq_method == sip_method_cancel)
                endpoint->onOfferCancelled();
            else
                endpoint->onOfferAcknowledged(request);
        });
    return 0;
}

void SipEndpoint::onOfferCancelled()
{
    trace("<- CANCEL of the offer");
    m_session.withdraw();
    refuseOffer(487);
}

/// Null: the ACK never came, and nobody knows what the peer goes by.
void SipEndpoint::onOfferAcknowledged(sip_t const* request)
{
    if (!m_isOfferAnswered)
        return;
    forgetOffer();
    if (request == nullptr)
    {
        clear({QCause::RECOVERY_ON_TIMER_EXPIRY, 0, {}});
        return;
    }
    trace("<- ACK");
    if (m_negotiation.getState() == SipOfferAnswer::OURS)
        takeAnswerOfAck(request);
    sendWaitingOffer();
}

void SipEndpoint::takeAnswerOfAck(sip_t const* request)
{
    std::string const session = SESSION_OF(request);
    noteSession(SipOfferAnswer::RECEIVED, SipOfferAnswer::ACK, session);
    m_quality.noteAnswer(session);
    if (session.empty())
        m_session.takeRefusal(488);
    else
        m_session.takeAnswer(session);
}

/// What our peer's last offer said of its listening counts once it is agreed on.
void SipEndpoint::followHold()
{
    if (m_isHeldByOffer == m_isHeld)
        return;
    m_isHeld = m_isHeldByOffer;
    CC_PropertyContainer own;
    ADD(own, CC_PropertyCallLegState(CC_PropertyId::STATE,
                                     m_isHeld ? CC_PropertyCallLegState::HELD : CC_PropertyCallLegState::CONNECTED));
    std::ignore = writeOwn(own); // without memory the other side hears of it by the next change
}

// --- ours ------------------------------------------------------------------------------------------------------------

/// Or a PRACK, or what our peer says to a refresh: what was said before must have arrived.
bool SipEndpoint::isAwaitingAck() const
{
    return m_dialog == SipDialogState::ANSWERED || m_isOfferAnswered || m_unacknowledged > 0 || m_isRefresh;
}

void SipEndpoint::sendOffer(std::string const& description, bool isQuick)
{
    if ((m_isOffering && !m_isRefresh) || (m_offerReceived != nullptr && !m_isOfferAnswered) || m_lateAck != nullptr)
    {
        m_session.takeRefusal(491);
        return;
    }
    if (m_dialog != SipDialogState::UP && m_dialog != SipDialogState::ANSWERED && !(isAgreedEarly() && m_allowsUpdate))
    {
        m_session.takeRefusal(504);
        return;
    }
    m_offer = description;
    m_isOfferQuick = isQuick;
    m_refusals = 0;
    m_isOfferWaiting = true;
    sendWaitingOffer();
}

void SipEndpoint::sendWaitingOffer()
{
    if (!isAwaitingAck() && std::exchange(m_isOfferWaiting, false))
        startOffer(m_offer, m_isOfferQuick);
}

/// Before the call is up, that of the party that was heard of last.
nta_leg_t* SipEndpoint::getOfferLeg() const
{
    bool const hasOtherLeg =
        isAgreedEarly() && !m_isCalling && m_fork < m_forks.size() && m_forks[m_fork].leg != nullptr;
    return hasOtherLeg ? m_forks[m_fork].leg : m_leg;
}

void SipEndpoint::startOffer(std::string const& description, bool isQuick)
{
    bool const isEarly = isAgreedEarly();
    bool const isUpdate = (isQuick || isEarly) && m_allowsUpdate && (m_isRefresh || !description.empty());
    nta_leg_t* const leg = getOfferLeg();
    bool const hasSession = !description.empty();
    trace(std::string(isUpdate ? "-> UPDATE" : "-> INVITE") + " in the dialog" +
          (hasSession ? " with a session description" : ""));
    m_reinvite.forget();
    m_isOffering = true;
    std::string const headers = m_sessionTimer.getRequestHeaders();
    noteSession(SipOfferAnswer::SENT, isUpdate ? SipOfferAnswer::UPDATE : SipOfferAnswer::INVITE, description);
    m_reinvite.transaction = m_interface.getSender().send(
        leg, HANDLE_OFFER_RESPONSE, this, isUpdate ? sip_method_update : sip_method_invite,
        isUpdate ? "UPDATE" : "INVITE", nullptr, SIPTAG_CONTACT_STR(getContact()), SIPTAG_SUPPORTED_STR("timer"),
        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
        TAG_IF(hasSession, SIPTAG_CONTENT_TYPE_STR("application/sdp")),
        TAG_IF(hasSession, SIPTAG_PAYLOAD_STR(description.c_str())), TAG_END());
    m_reinvite.sequence = nta_leg_get_seq(leg);
    if (m_reinvite.transaction == nullptr)
        onOfferRefused(500);
}

int SipEndpoint::HANDLE_OFFER_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response)
{
    int status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(transaction);
    if (response == nullptr && status < 300)
        status = 503; // nobody has accepted anything
    if (status >= 200)
        endpoint->handle([&] { endpoint->onOfferResponse(static_cast<unsigned int>(status), response); });
    return 0;
}

void SipEndpoint::onOfferResponse(unsigned int status, sip_t const* response)
{
    trace("<- " + std::to_string(status) + " to the offer");
    bool const isInvite = nta_outgoing_method(m_reinvite.transaction) == sip_method_invite;
    bool const isUp = m_dialog == SipDialogState::UP || isAgreedEarly() || m_dialog == SipDialogState::ANSWERED;
    if (status < 300)
        m_challenges = 0;
    if (status < 300 && (!m_isOffering || !isUp))
    {
        if (isInvite && m_lateAck != &m_reinvite) // repeated, or late: the call has ended meanwhile
            acknowledge(m_reinvite, {});
    }
    else if (!isUp || !m_isOffering)
        return;
    else if (authenticate(m_reinvite.transaction, response, getOfferLeg(), HANDLE_OFFER_RESPONSE))
        m_reinvite.sequence = nta_leg_get_seq(getOfferLeg());
    else if (m_isRefresh && status != 491)
        onRefreshed(status, response);
    else if (status < 300)
        onOfferAccepted(response);
    else if (status == 422 && raiseTimer(response))
        startOffer(m_offer, m_isOfferQuick);
    else if (status == 491 && ++m_refusals < MOST_REFUSALS)
        tryAgainLater();
    else
        onOfferRefused(status);
}

void SipEndpoint::onOfferAccepted(sip_t const* response)
{
    bool const isUpdate = nta_outgoing_method(m_reinvite.transaction) == sip_method_update;
    std::string const session = SESSION_OF(response);
    routeAsClient(m_leg, m_reinvite.transaction, response);
    m_isOffering = false;
    takeTimerOfAnswer(response);
    if (!m_offer.empty())
        m_ownSession = m_offer;
    noteSession(SipOfferAnswer::RECEIVED, isUpdate ? SipOfferAnswer::UPDATE_OK : SipOfferAnswer::FINAL, session);
    bool const isOffer = m_offer.empty() && !session.empty();
    if (isOffer)
        m_lateAck = &m_reinvite;
    else if (!isUpdate)
        acknowledge(m_reinvite, {});
    if (!isOffer && !session.empty())
    {
        m_quality.noteAnswer(session);
        m_session.takeAnswer(session);
        return;
    }
    m_offerOfPeer = session;
    m_isHeldByOffer = SipDescription::IS_HOLD(session);
    if (session.empty())
        m_session.takeRefusal(488); // it agrees to nothing
    else if (unsigned int const refusal = m_session.takeOffer(session, false); refusal != 0)
        sendRefusal(refusal);
}

/// The session stays as it was; a dialog of which the peer knows nothing is over (RFC 3261, 12.2.1.2).
void SipEndpoint::onOfferRefused(unsigned int status)
{
    m_isOffering = false;
    m_negotiation.fail();
    if (std::exchange(m_isRefresh, false))
    {
        startSessionTimer();
        sendWaitingOffer();
        return;
    }
    m_session.takeRefusal(REFUSAL_FOR_OTHER_SIDE(status));
    if (status == 481 || status == 408)
        clear({status == 481 ? QCause::CALL_REJECTED : QCause::RECOVERY_ON_TIMER_EXPIRY, status, {}});
}

void SipEndpoint::tryAgainLater()
{
    m_negotiation.fail();
    unsigned int const delay = RETRY_DELAY(!m_isCalling);
    trace("trying again in " + std::to_string(delay) + " ms");
    m_offerTimer.start(delay);
}

void SipEndpoint::ON_OFFER_TIMER(void* endpoint)
{
    auto& self = *static_cast<SipEndpoint*>(endpoint);
    self.handle(
        [&]
        {
            if (self.m_isOffering)
            {
                self.startOffer(self.m_offer, self.m_isOfferQuick);
            }
            else if (self.m_offerReceived == nullptr && self.m_dialog == SipDialogState::INVITE_RECEIVED)
                self.m_provisional == 0 ? self.onDialledOn() : self.repeatProvisional();
            else
            {
                self.m_session.withdraw(); // the other side does not know what to say
                self.refuseOffer(504);
            }
        });
}

/// Nobody is answered any more but with what ends a transaction.
void SipEndpoint::endOffers()
{
    m_isOffering = m_isRefresh = m_isOfferWaiting = false;
    m_offerTimer.stop();
    if (m_lateAck != nullptr)
        acknowledge(*m_lateAck, {});
    refuseOffer(487);
    forgetOffer();
}

void SipEndpoint::noteAllow(sip_t const* message)
{
    if (message->sip_allow == nullptr)
        return;
    m_allowsUpdate = sip_is_allowed(message->sip_allow, sip_method_update, nullptr) != 0;
    m_session.noteInfo(sip_is_allowed(message->sip_allow, sip_method_info, nullptr) != 0);
}
