#pragma once

#include "sip/Sofia.h"

#include <initializer_list>

/// The Privacy header (RFC 3323, RFC 3325, RFC 7044), which a message may have several times.
namespace SipPrivacy
{
/// Whether it asks for one of them, in whatever case.
bool HOLDS(sip_t const* message, std::initializer_list<char const*> values);
/// Somebody asked for privacy, and nobody knows for which.
bool IS_MALFORMED(sip_t const* message);
} // namespace SipPrivacy
