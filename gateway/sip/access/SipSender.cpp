#include "sip/access/SipSender.h"

#include "sip/stack/SipHandles.h"

#include <new>

namespace
{
void GIVE_UP(nta_outgoing_t* request)
{
    nta_outgoing_bind(request, nullptr, nullptr);
    nta_outgoing_destroy(request);
}
} // namespace

SipSender::~SipSender()
{
    for (auto const& [request, tries] : m_alone)
        GIVE_UP(request);
}

nta_outgoing_t* SipSender::sendSigned(msg_t* message, nta_leg_t* leg, nta_response_f* onResponse, SipEndpoint* endpoint,
                                      sip_method_t method, char const* name, url_string_t const* uri)
{
    if (message == nullptr || nta_msg_request_complete(message, leg, method, name, uri) < 0)
    {
        msg_destroy(message);
        return nullptr;
    }
    if (method != sip_method_ack)
        m_credentials->sign(message);
    return nta_outgoing_mcreate(m_agent, onResponse, endpoint, nullptr, message, TAG_END());
}

nta_outgoing_t* SipSender::sendAgain(nta_outgoing_t* old, sip_t const* response, nta_leg_t* leg,
                                     nta_response_f* onResponse, SipEndpoint* endpoint, unsigned char& tries)
{
    if (!m_credentials || old == nullptr || response == nullptr)
        return nullptr;
    SipHeldMessage const request(nta_outgoing_getrequest(old));
    if (leg == nullptr || request.get() == nullptr || !m_credentials->take(sip_object(request.get()), response, tries))
    {
        tries = 0;
        return nullptr;
    }
    msg_t* const copy = msg_dup(request.get());
    sip_t* const sip = sip_object(copy);
    if (sip == nullptr)
        return nullptr;
    while (sip->sip_via != nullptr)
        sip_header_remove(copy, sip, reinterpret_cast<sip_header_t*>(sip->sip_via));
    sip_header_remove(copy, sip, reinterpret_cast<sip_header_t*>(sip->sip_cseq));
    sip_request_t const* const line = sip->sip_request;
    nta_outgoing_t* const again =
        sendSigned(copy, leg, onResponse, endpoint, line->rq_method, line->rq_method_name, nullptr);
    if (again == nullptr)
        return nullptr;
    ++tries;
    GIVE_UP(old);
    return again;
}

msg_t* SipSender::addCredentialsOf(nta_outgoing_t* invite, msg_t* message)
{
    SipHeldMessage const request(invite != nullptr ? nta_outgoing_getrequest(invite) : nullptr);
    sip_t const* const from = sip_object(request.get());
    if (from == nullptr)
        return message;
    for (msg_auth_t const* const header : {from->sip_authorization, from->sip_proxy_authorization})
        if (header != nullptr)
            sip_add_dup(message, sip_object(message), reinterpret_cast<sip_header_t const*>(header));
    return message;
}

// --- requests that nobody waits for ----------------------------------------------------------------------------------

/// Without credentials the stack goes on by itself.
bool SipSender::keep(nta_outgoing_t* request, unsigned char tries)
{
    if (request == nullptr)
        return false;
    if (!m_credentials)
        nta_outgoing_destroy(request);
    else
        try
        {
            m_alone[request] = tries;
        }
        catch (std::bad_alloc const&)
        {
            GIVE_UP(request);
        }
    return true;
}

int SipSender::HANDLE_LONE_RESPONSE(SipEndpoint* sender, nta_outgoing_t* request, sip_t const* response)
{
    if (response == nullptr || response->sip_status->st_status >= 200)
        reinterpret_cast<SipSender*>(sender)->onLoneResponse(request, response);
    return 0;
}

void SipSender::onLoneResponse(nta_outgoing_t* request, sip_t const* response)
{
    auto const found = m_alone.find(request);
    unsigned char tries = found != m_alone.end() ? found->second : 0;
    m_alone.erase(request);
    nta_leg_t* const leg = response == nullptr
                               ? nullptr
                               : nta_leg_by_dialog(m_agent, nullptr, response->sip_call_id, response->sip_to->a_tag,
                                                   nullptr, response->sip_from->a_tag, nullptr);
    nta_outgoing_t* again = nullptr; // nor is there one in a dialog that is over
    try
    {
        again = sendAgain(request, response, leg, HANDLE_LONE_RESPONSE, asMagic(), tries);
    }
    catch (std::bad_alloc const&)
    {
    }
    if (again == nullptr)
        GIVE_UP(request);
    keep(again, tries);
}
