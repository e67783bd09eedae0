#pragma once

#include <cstddef>
#include <string>
#include <string_view>

/// Texts for display. Properties have them in UTF-8, the wire in ISO 8859-1: the element Display (Q.931, 4.5.16) says
/// IA5, and EuroISDN equipment fills the rest of the octet that way.
namespace IsdnText
{
/// What has no place in ISO 8859-1 becomes '?'; controls, which would move the display's cursor, a blank. Cut after so
/// many octets.
std::string TO_WIRE(std::string_view text, std::size_t longest);
/// The same for control characters; a text that is UTF-8 already stays what it is.
std::string FROM_WIRE(std::string_view text);
} // namespace IsdnText
