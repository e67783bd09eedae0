#pragma once

#include "properties/CC_PropertyParametrizedString.h"

#include <string>
#include <string_view>

/// User-to-user information of service 1 (Q.957.1; the element User-user, Q.931, 4.5.30): a text of at most 128 octets,
/// in the property as the Recommendation on SIP has it (RFC 7433): the protocol discriminator and the text in
/// hexadecimal digits, with the parameter encoding=hex. The stack sends the discriminator 04, IA5 characters, whatever
/// it was, and a text up to its first 0.
namespace IsdnUserUser
{
constexpr std::size_t LONGEST = 128; ///< octets
CC_PropertyParametrizedString::ParametrizedString FROM_WIRE(std::string_view text);
/// Empty for what is of another discriminator, or none of IA5.
std::string TO_WIRE(CC_PropertyParametrizedString::ParametrizedString const& content);
} // namespace IsdnUserUser
