#pragma once

#include "sip/stack/SipHandles.h"

#include <string>

/// Where requests to the other end of a dialog go: its contact, or, since one behind a NAT tells an address that nobody
/// else can reach, that contact at the address from which the message with it came. What a proxy on the way has put
/// into Record-Route stays: it knows better.
///
///     nta_leg_server_route(leg, request->sip_record_route, SipTarget(request, message).get());
class SipTarget
{
public:
    /// `message`: of `sip`, as the stack received it; null: the contact holds as it is. Throws std::bad_alloc.
    SipTarget(sip_t const* sip, msg_t const* message);

    /// As long as this and the message live; null: there is none.
    sip_contact_t const* get() const { return m_contact; }
    /// The URI of a contact, at the address from which the message came; empty when memory is out.
    static std::string AT_SOURCE(url_t const& uri, msg_t const* message);

private:
    SipHome m_home;
    sip_contact_t const* m_contact;
};
