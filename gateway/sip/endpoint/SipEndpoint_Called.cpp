// The called side: the call was offered, the INVITE is sent, its answers become states of the leg.
#include "sip/endpoint/SipEndpoint.h"

#include "calls/CC_Call.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipDiversion.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipPrivacy.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include <algorithm>
#include <tuple>

using namespace SipProperty;

namespace
{
constexpr unsigned int DEFAULT_MAX_FORWARDS = 69;
constexpr unsigned int LONGEST_REPETITION = 32000; // milliseconds for which a peer repeats an answer by default

void ADD_STATE(CC_PropertyContainer& properties, CC_PropertyCallLegState::State state)
{
    ADD(properties, CC_PropertyCallLegState(CC_PropertyId::STATE, state)); // a later answer tells more
}

/// What an answer with a session description brings: the description, and that media may come.
void ADD_SESSION(CC_PropertyContainer& properties, std::string const& session)
{
    if (session.empty())
        return;
    ADD_TEXT(properties, SipPropertyId::SESSION_DESCRIPTION, session);
    ADD(properties, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
}

/// Who answers, if the answer says so.
void ADD_CONNECTED(CC_PropertyContainer& properties, sip_t const* response)
{
    if (std::optional<SipParty> const connected = SipIdentity::READ_CONNECTED(response))
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
    m_ladder = m_interface.getEnvironment().trace.find(m_callNumber);
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
    if (m_interface.isPeerBusy())
        clear({QCause::TEMPORARY_FAILURE, 503, {}});
    else if (!sendInvite(called, properties))
        clear({QCause::NETWORK_OUT_OF_ORDER, 503, {}});
    return XCode::OK;
}

bool SipEndpoint::sendInvite(SipParty const& called, CC_PropertyContainer const& offerProperties)
{
    Configuration::Interface const& configuration = m_interface.getConfiguration();
    auto const* const maxForwards =
        dynamic_cast<CC_PropertyUnsigned const*>(offerProperties.get(SipPropertyId::MAX_FORWARDS));
    SipIdentity const caller{SipParty::OF_PEER(m_adapter), SipParty::SECOND_OF_PEER(m_adapter)};
    std::string const uri = SipAddress::MAKE_URI(called.getUser(), configuration.peer, configuration.usesTcp);
    std::string const to = SipAddress::MAKE_NAME_ADDR(called.name, uri);
    m_leg = nta_leg_tcreate(m_interface.getAgent(), HANDLE, this,
                            SIPTAG_FROM_STR(caller.getFrom(configuration.getAddress()).c_str()),
                            SIPTAG_TO_STR(to.c_str()), TAG_END());
    if (m_leg == nullptr || nta_leg_tag(m_leg, nullptr) == nullptr)
        return false;
    std::string const identityHeaders = SipIdentity::GET_ASSERTED(caller.party, configuration.getAddress()) +
                                        SipDiversion::OF_PEER(m_adapter).getHeaders(configuration.getAddress(), uri);
    return startInvite(uri, identityHeaders,
                       maxForwards != nullptr ? static_cast<unsigned int>(maxForwards->getValue())
                                              : DEFAULT_MAX_FORWARDS);
}

bool SipEndpoint::startInvite(std::string const& uri, std::string const& identityHeaders, unsigned int maxForwards)
{
    std::string const session = getPeerText(SipPropertyId::SESSION_DESCRIPTION);
    std::string const hops = std::to_string(maxForwards);
    m_hasOffer = !session.empty();
    trace("-> INVITE " + uri + (m_hasOffer ? " with a session description" : ""));
    m_invite = nta_outgoing_tcreate(
        m_leg, HANDLE_INVITE_RESPONSE, this, nullptr, SIP_METHOD_INVITE, URL_STRING_MAKE(uri.c_str()),
        SIPTAG_CONTACT_STR(m_interface.getContact(m_interface.getConfiguration().usesTcp).c_str()),
        SIPTAG_ALLOW(m_interface.getAllow()), SIPTAG_SUPPORTED_STR(""), SIPTAG_MAX_FORWARDS_STR(hops.c_str()),
        TAG_IF(!identityHeaders.empty(), SIPTAG_HEADER_STR(identityHeaders.c_str())),
        TAG_IF(m_hasOffer, SIPTAG_CONTENT_TYPE_STR("application/sdp")),
        TAG_IF(m_hasOffer, SIPTAG_PAYLOAD_STR(session.c_str())), TAG_END());
    if (m_invite == nullptr)
        return false;
    m_inviteSequence = nta_leg_get_seq(m_leg);
    m_dialog = Dialog::INVITE_SENT;
    m_timer.start(m_interface.getConfiguration().answerTimeout * 1000);
    return true;
}

int SipEndpoint::HANDLE_INVITE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response)
{
    int const status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(transaction);
    endpoint->handle(
        [&]
        {
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
    if (m_dialog != Dialog::INVITE_SENT || response == nullptr)
        return;
    m_hasRung = m_hasRung || status == 180;
    trace("<- " + std::to_string(status));
    CC_PropertyContainer own;
    std::string const session = SESSION_OF(response);
    if (m_hasOffer)
        m_quality.noteAnswer(session);
    ADD_CONNECTED(own, response);
    ADD_SESSION(own, session);
    if (status == 183) // an announcement or a tone may come even when the description did earlier
        ADD(own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    ADD_STATE(own, m_hasRung ? CC_PropertyCallLegState::ALERTING : CC_PropertyCallLegState::PROCEEDING);
    std::ignore = writeOwn(own); // what memory refuses the other side does not hear; the next answer may fit
}

void SipEndpoint::onAnswer(sip_t const* response)
{
    trace("<- 200");
    switch (m_dialog)
    {
    case Dialog::INVITE_SENT:
        break;
    case Dialog::CANCELLED: // the answer crossed our CANCEL
        m_timer.stop();
        confirmDialog(response);
        acknowledge({});
        sendBye(m_byeAfterAck.value_or(SipCause{}));
        return;
    default: // repeated: our ACK was lost
        if (!m_isAckLate)
            acknowledge({});
        return;
    }
    m_timer.start(std::max(m_interface.getConfiguration().t1x64, LONGEST_REPETITION));
    confirmDialog(response);
    m_wasAnswered = true;
    std::string const session = SESSION_OF(response);
    if (m_hasOffer || session.empty())
        acknowledge({});
    if (m_hasOffer)
        m_quality.noteAnswer(session);
    CC_PropertyContainer own;
    ADD_CONNECTED(own, response);
    ADD_SESSION(own, session);
    ADD_STATE(own, CC_PropertyCallLegState::CONNECTED);
    if (!writeOwn(own).isOk())
        clear({QCause::RESOURCE_UNAVAILABLE, 0, {}}); // nobody would ever hear of the answer
}

void SipEndpoint::onRejected(unsigned int status, sip_t const* response)
{
    bool const isOurs = response == nullptr || nta_sip_is_internal(response); // the stack's word for a peer's silence
    if (m_dialog != Dialog::INVITE_SENT && m_dialog != Dialog::CANCELLED)
        return;
    m_dialog = Dialog::OVER;
    trace(isOurs ? "no answer to the INVITE (" + std::to_string(status) + ")" : "<- " + std::to_string(status));
    forgetInvite();
    if (!isOurs && status == 503 && response->sip_retry_after != nullptr)
        m_interface.leavePeerAlone(response->sip_retry_after->af_delta);
    if (isOurs)
        leaveCall({status == 408 ? QCause::NO_USER_RESPONDING : QCause::DESTINATION_OUT_OF_ORDER, status, {}});
    else
        leaveCall(SipCause::FROM_RESPONSE(status, response->sip_status->st_phrase, REASON_OF(response)));
}

/// The callee has rung for too long; or, after a CANCEL, does not end its INVITE.
void SipEndpoint::onAnswerTimeout()
{
    if (m_wasAnswered) // no answer is repeated after this time
    {
        forgetInvite();
        return;
    }
    if (m_dialog == Dialog::CANCELLED)
    {
        forgetInvite();
        setDialog(Dialog::OVER);
        return;
    }
    if (m_dialog != Dialog::INVITE_SENT)
        return;
    trace("the callee has not answered in time");
    bool const hasRung = m_hasRung;
    clear({hasRung ? QCause::NO_ANSWER_FROM_USER : QCause::NO_USER_RESPONDING, hasRung ? 480u : 408u, {}});
}

void SipEndpoint::confirmDialog(sip_t const* response)
{
    nta_leg_rtag(m_leg, response->sip_to->a_tag);
    nta_leg_client_route(m_leg, response->sip_record_route, response->sip_contact);
    m_dialog = Dialog::UP;
    m_isAckLate = true; // whatever comes in between
}

void SipEndpoint::acknowledge(std::string const& sessionDescription)
{
    // a BYE may have gone out since, but the ACK bears the INVITE's number
    std::string const sequence = std::to_string(m_inviteSequence) + " ACK";
    bool const hasSession = !sessionDescription.empty();
    trace(std::string("-> ACK") + (hasSession ? " with a session description" : ""));
    m_isAckLate = false;
    // given up at once: the stack keeps it for its time, not for as long as the call; a repeated answer gets another
    nta_outgoing_t* const ack = nta_outgoing_tcreate(
        m_leg, nullptr, nullptr, nullptr, SIP_METHOD_ACK, nullptr, SIPTAG_CSEQ_STR(sequence.c_str()),
        TAG_IF(hasSession, SIPTAG_CONTENT_TYPE_STR("application/sdp")),
        TAG_IF(hasSession, SIPTAG_PAYLOAD_STR(sessionDescription.c_str())), TAG_END());
    if (ack != nullptr)
        nta_outgoing_destroy(ack);
}

/// The other side's answer to the offer that came with our 200 is here.
void SipEndpoint::acknowledgeLate()
{
    std::string const session = getPeerText(SipPropertyId::SESSION_DESCRIPTION);
    if (session.empty())
        return;
    m_quality.noteAnswer(session);
    acknowledge(session);
}

void SipEndpoint::cancel(SipCause const& cause)
{
    std::string const reason = cause.getReasonHeader(true);
    trace("-> CANCEL, Reason: " + reason);
    m_byeAfterAck = cause; // should it be answered all the same
    m_dialog = Dialog::CANCELLED;
    nta_outgoing_tcancel(m_invite, nullptr, nullptr, SIPTAG_REASON_STR(reason.c_str()), TAG_END());
    m_timer.start(m_interface.getConfiguration().t1x64);
}

void SipEndpoint::forgetInvite()
{
    if (m_invite == nullptr)
        return;
    nta_outgoing_bind(m_invite, nullptr, nullptr);
    nta_outgoing_destroy(std::exchange(m_invite, nullptr));
}
