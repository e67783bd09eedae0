// What either side does inside its dialog, and how a dialog ends.
#include "sip/dialog/SipTarget.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/endpoint/SipRules.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipContent.h"
#include "sip/message/SipPropertyId.h"

int SipEndpoint::handleRequest(nta_leg_t*, nta_incoming_t* transaction, sip_t const* request)
{
    int status = 500; // what memory kept from being done
    handle([&] { status = onRequest(transaction, request); });
    return status;
}

int SipEndpoint::onRequest(nta_incoming_t* transaction, sip_t const* request)
{
    sip_method_t const method = request->sip_request->rq_method;
    if (int const refused =
            method != sip_method_ack ? SipRules::CHECK_REQUIRED(transaction, request, m_interface.getSupported()) : 0;
        refused != 0)
        return refused;
    switch (method)
    {
    case sip_method_bye:
        return onBye(transaction, request);
    case sip_method_ack:
        return 0; // of a 200 whose transaction is gone
    case sip_method_options:
        return m_interface.answerOptions(transaction);
    case sip_method_invite:
        if (m_isCalling && isOverlapping() && request->sip_to->a_tag == nullptr) // the stack takes it for the dialog's
            return onMoreDigits(transaction, request);
        [[fallthrough]];
    case sip_method_update:
        return onOffer(transaction, request);
    case sip_method_info:
        return onInfo(transaction, request);
    case sip_method_refer:
        return onRefer(transaction, request);
    case sip_method_notify:
        return onNotify(request);
    default:
        break;
    }
    int const refused = m_interface.refuseMethod(transaction, request);
    return refused != 0 ? refused : 481;
}

/// The call is up: no INVITE of its beginning is sent or answered again, and calls last far longer than they begin.
void SipEndpoint::forgetSetUp()
{
    for (std::string* const text :
         {&m_inviteUri, &m_inviteHeaders, &m_inviteRoute, &m_headersForTarget, &m_earlySession})
        std::string().swap(*text);
    std::vector<SipRedirection>().swap(m_redirections);
}

int SipEndpoint::onBye(nta_incoming_t* transaction, sip_t const* request)
{
    SipCause const cause = SipCause::FROM_REQUEST(REASON_OF(request));
    bool const wasUp = m_dialog == SipDialogState::UP || m_dialog == SipDialogState::ANSWERED;
    SipDialogState::Action const action = advance(SipDialogState::BYE_IN);
    if (action == SipDialogState::REFUSE)
        return 481; // there is no dialog yet
    trace("<- BYE");
    takeCharge(request); // it ends whatever that is
    if (action == SipDialogState::TERMINATE)
        answerFinally(487, {});
    else if (!wasUp)
        return 200; // both sides hang up at once: ours is answered as well
    takeCarried(request);
    endOffers();
    forgetTransaction();
    if (awaitsFinalCharge())
        return holdBye(transaction, cause);
    leaveCall(cause);
    return 200;
}

/// Ends the SIP side as its state demands; nothing happens when it is ending already.
void SipEndpoint::endDialog(SipCause const& cause)
{
    switch (advance(SipDialogState::END))
    {
    case SipDialogState::REJECT:
        answerFinally(cause.getFinalStatus(), cause.getReasonHeader(false));
        break;
    case SipDialogState::BYE_AFTER_ACK:
        if (!m_byeAfterAck)
            m_byeAfterAck = cause;
        break;
    case SipDialogState::SEND_CANCEL:
        cancel(cause);
        break;
    case SipDialogState::SEND_BYE:
        endOffers();
        sendBye(cause);
        break;
    default:
        break;
    }
    finishIfDone();
}

void SipEndpoint::sendBye(SipCause const& cause)
{
    std::string const reason = cause.getReasonHeader(true);
    std::string const charge = getFinalCharge();
    std::string const userToUser = getLastUserToUser();
    trace("-> BYE" + std::string(charge.empty() ? "" : " with a charge") + ", Reason: " + reason);
    SipContent const content = SipContent::OF({}, charge, getNewIsup());
    sip_payload_t const payload = content.getPayload();
    m_bye = m_interface.getSender().send(m_leg, HANDLE_BYE_RESPONSE, this, SIP_METHOD_BYE, nullptr,
                                         SIPTAG_REASON_STR(reason.c_str()),
                                         TAG_IF(!userToUser.empty(), SIPTAG_HEADER_STR(userToUser.c_str())),
                                         TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str())),
                                         TAG_IF(!content.isEmpty(), SIPTAG_PAYLOAD(&payload)), TAG_END());
    if (m_bye != nullptr)
        return;
    advance(SipDialogState::BYE_DONE);
    finishIfDone();
}

int SipEndpoint::HANDLE_BYE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response)
{
    int const status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(transaction);
    if (status < 200)
        return 0;
    bool const isOurs = response == nullptr || nta_sip_is_internal(response);
    if (endpoint->authenticate(endpoint->m_bye, response, endpoint->m_leg, HANDLE_BYE_RESPONSE))
        return 0;
    nta_outgoing_destroy(transaction);
    endpoint->m_bye = nullptr;
    endpoint->advance(SipDialogState::BYE_DONE);
    endpoint->handle(
        [&]
        {
            endpoint->trace(isOurs ? "the BYE was not answered" : "<- " + std::to_string(status) + " to the BYE");
            endpoint->takeBill(isOurs ? nullptr : response);
        });
    endpoint->finishIfDone();
    return 0;
}

/// Whether the request goes out once more, with the credentials that its answer has asked for.
bool SipEndpoint::authenticate(nta_outgoing_t*& request, sip_t const* response, nta_leg_t* leg,
                               nta_response_f* onResponse)
{
    if (response == nullptr)
        return false;
    nta_outgoing_t* again = nullptr;
    try
    {
        again = m_interface.getSender().sendAgain(request, response, leg, onResponse, this, m_challenges);
        if (again == nullptr)
            return false;
        request = again;
        trace("<- " + std::to_string(response->sip_status->st_status) + ", once more with credentials");
    }
    catch (std::bad_alloc const&) // it went out untold, or not at all
    {
    }
    return again != nullptr;
}

/// The Reason header's whole value, empty without one. The stack has split it at its commas.
std::string SipEndpoint::REASON_OF(sip_t const* message)
{
    std::string text;
    for (sip_reason_t const* reason = message->sip_reason; reason != nullptr; reason = reason->re_next)
    {
        text += text.empty() ? "" : ", ";
        text += reason->re_protocol != nullptr ? reason->re_protocol : "";
        for (msg_param_t const* parameter = reason->re_params; parameter != nullptr && *parameter != nullptr;
             ++parameter)
            text += std::string(";") + *parameter;
    }
    return text;
}

/// Where requests in the dialog go from now on. @{
void SipEndpoint::routeAsServer(nta_leg_t* leg, nta_incoming_t* transaction, sip_t const* request) const
{
    bool const isBehindNat = m_interface.getConfiguration().isBehindNat;
    SipHeldMessage const message(isBehindNat ? nta_incoming_getrequest(transaction) : nullptr);
    nta_leg_server_route(leg, request->sip_record_route, SipTarget(request, message.get()).get());
}

void SipEndpoint::routeAsClient(nta_leg_t* leg, nta_outgoing_t* transaction, sip_t const* response) const
{
    bool const isBehindNat = m_interface.getConfiguration().isBehindNat;
    SipHeldMessage const message(isBehindNat ? nta_outgoing_getresponse(transaction) : nullptr);
    nta_leg_client_route(leg, response->sip_record_route, SipTarget(response, message.get()).get());
}
/// @}

char const* SipEndpoint::getContact() const
{
    return (isInConference() ? m_interface.getFocusContact(m_way) : m_interface.getContact(m_way)).c_str();
}

bool SipEndpoint::isInConference() const
{
    return m_adapter.getCallPropertyUnfiltered(SipPropertyId::CONFERENCE) != nullptr;
}

/// What else was in the way of a request has got it its 415 before; a response is taken as far as it is understood.
std::string SipEndpoint::SESSION_OF(sip_t const* message) { return SipBody::READ(message, true).session; }
