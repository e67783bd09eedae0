#pragma once

#include "sip/stack/Sofia.h"

#include <string>
#include <string_view>

/// Calls to a service instead of a number (RFC 5031): urn:service:sos and those below it, such as urn:service:sos.fire.
/// Call control and the routes have them as they are, in small letters, in the place of a number.
namespace SipService
{
/// Empty for any other URI. Throws std::bad_alloc.
std::string READ(url_t const& uri);
bool IS_ONE(std::string_view number);
} // namespace SipService
