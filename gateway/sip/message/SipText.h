#pragma once

#include <initializer_list>
#include <string_view>

/// Reading the small grammars of header values: lists and parameters.
namespace SipText
{
/// No character to be shown: a line break among them, which would end a header or a line of the log.
bool IS_CONTROL(char c);
/// Without blanks and line breaks at its ends.
std::string_view TRIM(std::string_view text);
bool EQUALS_IGNORING_CASE(std::string_view left, std::string_view right);
bool IS_ONE_TOKEN(std::string_view text);                                        ///< of RFC 3261, 25.1
bool IS_ONE_OF(std::string_view text, std::initializer_list<char const*> words); ///< in whatever case
/// Cuts the text up to `separator` off `rest`, and the separator; trimmed. A separator inside quotes does not count.
std::string_view CUT(std::string_view& rest, char separator);
/// The value, as it stands, of the first "name=value" in a list with that separator; empty without one.
std::string_view FIND_PARAMETER(std::string_view list, char separator, std::string_view name);
/// 0 for what is no number of that range.
unsigned int NUMBER(std::string_view text, unsigned int least, unsigned int most);
} // namespace SipText
