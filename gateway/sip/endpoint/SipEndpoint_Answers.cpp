// The calling side: the answers to the INVITE, which follow the peer leg.
#include "sip/endpoint/SipEndpoint.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCallProgressTone.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipContent.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipPropertyId.h"

#include <algorithm>
#include <utility>

namespace
{
constexpr unsigned int LONGEST_SILENCE = 60000; // milliseconds
constexpr unsigned int MOST_FORKS = 32;
} // namespace

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
    SipContent const content = SipContent::OF(isAnswer ? session : std::string(), getTariffForAnswer(), getNewIsup());
    sip_payload_t const payload = content.getPayload();
    nta_reliable_t const* const reliable = nta_reliable_treply(
        m_transaction, HANDLE_PRACK, this, status, phrase, SIPTAG_CONTACT_STR(getContact()),
        SIPTAG_ALLOW(m_interface.getAllow()), TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
        TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
        TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD(&payload)), TAG_END());
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
    SipContent const content = SipContent::OF(session, getTariffForAnswer(), getNewIsup());
    sip_payload_t const payload = content.getPayload();
    nta_incoming_treply(m_transaction, status, phrase, SIPTAG_CONTACT_STR(getContact()),
                        SIPTAG_ALLOW(m_interface.getAllow()), SIPTAG_SUPPORTED(m_interface.getSupported()),
                        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
                        TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
                        TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD(&payload)), TAG_END());
}

void SipEndpoint::answerFinally(unsigned int status, std::string const& reasonHeader)
{
    trace("-> " + std::to_string(status) + (reasonHeader.empty() ? "" : ", Reason: ") + reasonHeader);
    std::string const headers = getCarried(SipCarriedHeaders::RESPONSE);
    SipContent const content = SipContent::OF({}, {}, getNewIsup());
    sip_payload_t const payload = content.getPayload();
    nta_incoming_treply(m_transaction, static_cast<int>(status), nullptr,
                        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())),
                        TAG_IF(!reasonHeader.empty(), SIPTAG_REASON_STR(reasonHeader.c_str())),
                        TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
                        TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD(&payload)), TAG_END());
    forgetTransaction(); // the stack goes on repeating the answer until its ACK
}

void SipEndpoint::forgetTransaction()
{
    if (m_transaction == nullptr)
        return;
    nta_incoming_bind(m_transaction, nullptr, nullptr);
    nta_incoming_destroy(std::exchange(m_transaction, nullptr));
}
