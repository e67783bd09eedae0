#pragma once

#include "properties/CC_PropertyParametrizedString.h"
#include "sip/stack/Sofia.h"

#include <optional>
#include <string>

/// User-to-user information, the header User-to-User (RFC 7433) to the library's property and back: its content without
/// quotes, and its parameters. Of several the first counts; what is malformed, or has more than LONGEST octets, counts
/// as absent. What an ISDN side hears and tells is in the same property, its content in hexadecimal digits.
namespace SipUserToUser
{
inline constexpr std::size_t LONGEST = 1024; ///< octets of a header's value

/// Throws std::bad_alloc.
std::optional<CC_PropertyParametrizedString::ParametrizedString> READ(sip_t const* message);
/// The line, with its line break; empty for what cannot be told. Throws std::bad_alloc.
std::string GET_LINE(CC_PropertyParametrizedString::ParametrizedString const& content);
} // namespace SipUserToUser
