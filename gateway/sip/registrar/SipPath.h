#pragma once

#include "sip/stack/Sofia.h"

#include <optional>
#include <string>

/// By whom a phone is reached that has registered through a proxy (RFC 3327): the Path of its REGISTER, as the Route of
/// what goes to it later.
namespace SipPath
{
/// "<sip:edge.example;lr>, <sip:next.example;lr>", empty without a Path. Nothing for one that is of no use: a proxy
/// that does not route loosely, or more of them than any network has.
std::optional<std::string> READ(sip_t const* request);
/// That who registers is told of it, which is for one alone who understands it.
std::string GET_HEADER(sip_t const* request, std::string const& route);
} // namespace SipPath
