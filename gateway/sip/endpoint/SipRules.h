#pragma once

#include "sip/message/SipWay.h"
#include "sip/stack/Sofia.h"

#include <string_view>

/// What a request is refused for by RFC 3261, section 8.2, whatever it asks for.
///
/// Each rule answers the transaction itself where the answer bears headers, and returns the status with which the
/// request is refused; 0: it is not.
namespace SipRules
{
constexpr unsigned int MOST_FORWARDS = 70; ///< with which a request leaves, at most

/// Of a request outside of dialogs: the URI's scheme (416), extensions (420), Max-Forwards (400, 483).
int CHECK(nta_incoming_t* transaction, sip_t const* request, sip_supported_t const* supported);
/// An extension that is required and not among the supported: 420 with Unsupported.
int CHECK_REQUIRED(nta_incoming_t* transaction, sip_t const* request, sip_supported_t const* supported);
/// A body, or an encoding, that is not understood and not optional either: 415 with Accept and Accept-Encoding.
int CHECK_BODY(nta_incoming_t* transaction, sip_t const* request, bool takesIsup);

/// What the called side is to count down from: one less than the request's own, within bounds.
unsigned int MAX_FORWARDS_AFTER(sip_t const* request);
/// How the request came, says its Via, which the stack has held against the transport; and whether the dialog that it
/// begins must stay on TLS (RFC 3261, 12.1.1).
SipWay::Way WAY_OF(sip_t const* request);
} // namespace SipRules
