#pragma once

#include "sip/access/SipCredentials.h"
#include "sip/stack/Sofia.h"

#include <map>
#include <optional>

/// How requests leave an interface: as the stack sends them, or, where the interface has credentials, signed with
/// these.
///
/// Where it has none nothing is done and nothing kept that the stack would not. Belongs to its interface, which ends
/// the agent after it.
class SipSender
{
public:
    SipSender(nta_agent_t* agent, std::optional<SipCredentials> credentials)
        : m_agent(agent), m_credentials(std::move(credentials))
    {
    }
    ~SipSender();
    SipSender(SipSender const&) = delete;
    SipSender& operator=(SipSender const&) = delete;

    /// As nta_outgoing_tcreate; null when the stack refuses.
    template <class... Tags>
    nta_outgoing_t* send(nta_leg_t* leg, nta_response_f* onResponse, SipEndpoint* endpoint, sip_method_t method,
                         char const* name, url_string_t const* uri, Tags... tags)
    {
        return m_credentials ? sendSigned(makeMessage(nullptr, tags...), leg, onResponse, endpoint, method, name, uri)
                             : nta_outgoing_tcreate(leg, onResponse, endpoint, nullptr, method, name, uri, tags...);
    }
    /// The ACK of an INVITE that was answered with 200: it bears the INVITE's credentials (RFC 3261, 22.1). The stack
    /// keeps it for its time, since it tells by it whose a repeated answer is.
    template <class... Tags>
    void acknowledge(nta_leg_t* leg, nta_outgoing_t* invite, Tags... tags)
    {
        nta_outgoing_t* const ack =
            m_credentials ? sendSigned(makeMessage(invite, tags...), leg, nullptr, nullptr, SIP_METHOD_ACK, nullptr)
                          : nta_outgoing_tcreate(leg, nullptr, nullptr, nullptr, SIP_METHOD_ACK, nullptr, tags...);
        if (ack != nullptr)
            nta_outgoing_destroy(ack);
    }
    /// A request in a dialog whose answer nobody waits for, but for one that asks for credentials. Whether it was sent.
    template <class... Tags>
    bool sendAlone(nta_leg_t* leg, sip_method_t method, char const* name, Tags... tags)
    {
        nta_response_f* const onResponse = m_credentials ? HANDLE_LONE_RESPONSE : nullptr;
        return keep(send(leg, onResponse, m_credentials ? asMagic() : nullptr, method, name, nullptr, tags...), 0);
    }

    /// For an answer that asks for credentials and can have them: the request once more, with the next number of the
    /// leg; the old transaction is given up. Null: the answer stands. `tries` counts them from answer to answer.
    nta_outgoing_t* sendAgain(nta_outgoing_t* old, sip_t const* response, nta_leg_t* leg, nta_response_f* onResponse,
                              SipEndpoint* endpoint, unsigned char& tries);

    /// Null where the interface has none.
    SipCredentials const* getCredentials() const { return m_credentials ? &*m_credentials : nullptr; }

private:
    nta_outgoing_t* sendSigned(msg_t* message, nta_leg_t* leg, nta_response_f* onResponse, SipEndpoint* endpoint,
                               sip_method_t method, char const* name, url_string_t const* uri);
    static int HANDLE_LONE_RESPONSE(SipEndpoint* sender, nta_outgoing_t* request, sip_t const* response);
    void onLoneResponse(nta_outgoing_t* request, sip_t const* response);
    bool keep(nta_outgoing_t* request, unsigned char tries);
    /// The stack hands back what it was given, whose type is that of most who send.
    SipEndpoint* asMagic() { return reinterpret_cast<SipEndpoint*>(this); }

    /// Null when the stack refuses. `invite`: whose credentials it bears; may be null.
    template <class... Tags>
    msg_t* makeMessage(nta_outgoing_t* invite, Tags... tags)
    {
        msg_t* const message = nta_msg_create(m_agent, 0);
        if (message != nullptr && sip_add_tl(message, sip_object(message), tags...) >= 0)
            return addCredentialsOf(invite, message);
        msg_destroy(message);
        return nullptr;
    }
    static msg_t* addCredentialsOf(nta_outgoing_t* invite, msg_t* message);

    nta_agent_t* m_agent;
    std::optional<SipCredentials> m_credentials;
    std::map<nta_outgoing_t*, unsigned char> m_alone; // how many times they were sent again
};
