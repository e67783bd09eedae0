#pragma once

#include <string>
#include <string_view>

/// What the SIP side itself must know of a session description, read and written with the stack's parser. Nothing here
/// keeps state.
namespace SipDescription
{
/// Whether it is one that the stack can read. What is not is handed on as it is, but nobody is held by it.
bool IS_READABLE(std::string_view description);

/// Whether its sender will not listen: each stream of voice is sendonly or inactive, or its address is 0.0.0.0 (the
/// older way, RFC 3264, 8.4). Streams that are refused do not count; false for a description without another.
bool IS_HOLD(std::string_view description);

/// An answer that refuses each stream of the offer (port 0, RFC 3264, 6); empty for an offer that cannot be read,
/// or not be written again.
std::string REFUSING(std::string_view offer);
} // namespace SipDescription
