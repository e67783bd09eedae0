#include "sip/message/SipText.h"

#include <algorithm>
#include <cctype>
#include <charconv>

namespace
{
constexpr bool IS_BLANK(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }
} // namespace

bool SipText::IS_CONTROL(char c)
{
    auto const octet = static_cast<unsigned char>(c);
    return octet < 0x20 || octet == 0x7f;
}

std::string_view SipText::TRIM(std::string_view text)
{
    while (!text.empty() && IS_BLANK(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && IS_BLANK(text.back()))
        text.remove_suffix(1);
    return text;
}

bool SipText::EQUALS_IGNORING_CASE(std::string_view left, std::string_view right)
{
    return std::equal(left.begin(), left.end(), right.begin(), right.end(),
                      [](unsigned char a, unsigned char b) { return std::tolower(a) == std::tolower(b); });
}

bool SipText::IS_ONE_TOKEN(std::string_view text)
{
    constexpr std::string_view MARKS = "-.!%*_+`'~";
    return !text.empty() && std::all_of(text.begin(), text.end(),
                                        [&](unsigned char c) {
                                            return (c < 0x80 && std::isalnum(c) != 0) ||
                                                   MARKS.find(static_cast<char>(c)) != std::string_view::npos;
                                        });
}

bool SipText::IS_ONE_OF(std::string_view text, std::initializer_list<char const*> words)
{
    return std::any_of(words.begin(), words.end(), [&](char const* word) { return EQUALS_IGNORING_CASE(text, word); });
}

std::string_view SipText::CUT(std::string_view& rest, char separator)
{
    bool isQuoted = false;
    std::size_t i = 0;
    for (; i < rest.size(); ++i)
    {
        if (isQuoted && rest[i] == '\\')
            ++i;
        else if (rest[i] == '"')
            isQuoted = !isQuoted;
        else if (!isQuoted && rest[i] == separator)
            break;
    }
    std::size_t const length = std::min(i, rest.size());
    std::string_view const piece = rest.substr(0, length);
    rest.remove_prefix(std::min(length + 1, rest.size()));
    return TRIM(piece);
}

std::string_view SipText::FIND_PARAMETER(std::string_view list, char separator, std::string_view name)
{
    while (!list.empty())
    {
        std::string_view value = CUT(list, separator);
        if (EQUALS_IGNORING_CASE(CUT(value, '='), name))
            return TRIM(value);
    }
    return {};
}

unsigned int SipText::NUMBER(std::string_view text, unsigned int least, unsigned int most)
{
    unsigned int value = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    bool const isNumber = error == std::errc() && end == text.data() + text.size();
    return isNumber && value >= least && value <= most ? value : 0;
}
