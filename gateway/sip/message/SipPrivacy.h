#pragma once

#include "sip/stack/Sofia.h"

/// The Privacy header (RFC 3323, RFC 3325, RFC 7044), which a message may have several times. A malformed one asks for
/// everything: what is shown by mistake cannot be taken back.
namespace SipPrivacy
{
/// The sender is not to be shown: id, user or header; with a line in the log for a malformed one.
bool RESTRICTS_SENDER(sip_t const* message);
/// Nor whoever redirected the call: history, header or session.
bool RESTRICTS_HISTORY(sip_t const* message);
/// none: the sender is shown even though its address is that of nobody.
bool IS_NONE(sip_t const* message);
} // namespace SipPrivacy
