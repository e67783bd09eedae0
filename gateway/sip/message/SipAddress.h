#pragma once

#include "configuration/SocketAddress.h"
#include "sip/message/SipWay.h"

#include <string>
#include <string_view>

/// How numbers and names are written into SIP addresses. Reading them is the stack's work; only the user part comes
/// out of it still escaped.
namespace SipAddress
{
/// The user part with "%41" and its kin replaced by what they stand for. A malformed escape stays as it is, and so does
/// one of a control character: a number has none, and a line break would reach traces and logs.
std::string UNESCAPE_USER(std::string_view user);
/// The text as a user part: what the grammar of RFC 3261 does not allow there is escaped.
std::string ESCAPE_USER(std::string_view user);

/// "sip:4989123@192.0.2.1:5060", with ";transport=tcp" or ";transport=tls" where it goes that way, or "sips:..."; with
/// a name for an address ";transport=udp" is told, too. Without a user: "sip:192.0.2.1:5060".
std::string MAKE_URI(std::string_view user, SocketAddress const& address, SipWay::Way way);
/// "\"Alice\" <sip:...>", or "<sip:...>" for an empty name.
std::string MAKE_NAME_ADDR(std::string_view displayName, std::string_view uri);
} // namespace SipAddress
