#include "operation/control/ControlRequest.h"

#include <utility>

namespace
{
constexpr std::string_view BLANKS = " \t\r";

/// The first word, which is taken off the text; empty: none is left.
std::string_view TAKE_WORD(std::string_view& text)
{
    std::size_t const start = text.find_first_not_of(BLANKS);
    text.remove_prefix(start != std::string_view::npos ? start : text.size());
    std::string_view const word = text.substr(0, text.find_first_of(BLANKS));
    text.remove_prefix(word.size());
    return word;
}
} // namespace

ControlRequest ControlRequest::PARSE(std::string_view line)
{
    ControlRequest request;
    for (std::string_view word = TAKE_WORD(line); !word.empty(); word = TAKE_WORD(line))
        if (word == "--json")
            request.isJson = true;
        else if (word.starts_with("--"))
            request.options[std::string(word.substr(2))] = TAKE_WORD(line);
        else if (request.verb.empty())
            request.verb = word;
        else
            request.arguments.emplace_back(word);
    return request;
}
