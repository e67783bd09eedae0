#include "SipReason.h"

#include <algorithm>
#include <cctype>
#include <charconv>

namespace
{
constexpr bool IS_BLANK(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

std::string_view TRIM(std::string_view text)
{
    while (!text.empty() && IS_BLANK(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && IS_BLANK(text.back()))
        text.remove_suffix(1);
    return text;
}

bool EQUALS_IGNORING_CASE(std::string_view left, std::string_view right)
{
    return std::equal(left.begin(), left.end(), right.begin(), right.end(),
                      [](unsigned char a, unsigned char b) { return std::tolower(a) == std::tolower(b); });
}

/// Cuts the text up to `separator` off `rest`; a separator inside quotes does not count.
std::string_view CUT(std::string_view& rest, char separator)
{
    bool isQuoted = false;
    std::size_t i = 0;
    for (; i < rest.size(); ++i)
    {
        if (isQuoted && rest[i] == '\\')
            ++i;
        else if (i < rest.size() && rest[i] == '"')
            isQuoted = !isQuoted;
        else if (!isQuoted && rest[i] == separator)
            break;
    }
    std::size_t const length = std::min(i, rest.size());
    std::string_view const piece = rest.substr(0, length);
    rest.remove_prefix(std::min(length + 1, rest.size()));
    return TRIM(piece);
}

/// 0 for what is no number of that range.
unsigned int NUMBER(std::string_view text, unsigned int least, unsigned int most)
{
    unsigned int value = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    bool const isNumber = error == std::errc() && end == text.data() + text.size();
    return isNumber && value >= least && value <= most ? value : 0;
}

/// One reason value: "protocol;cause=...;text=...".
void READ_VALUE(std::string_view value, SipReason& reason)
{
    std::string_view const protocol = CUT(value, ';');
    bool const isQ850 = EQUALS_IGNORING_CASE(protocol, "Q.850");
    if (!isQ850 && !EQUALS_IGNORING_CASE(protocol, "SIP"))
        return;
    unsigned int cause = 0;
    std::string text;
    while (!value.empty())
    {
        std::string_view parameter = CUT(value, ';');
        std::string_view const name = CUT(parameter, '=');
        if (EQUALS_IGNORING_CASE(name, "cause"))
            cause = isQ850 ? NUMBER(TRIM(parameter), 1, 127) : NUMBER(TRIM(parameter), 100, 699);
        else if (EQUALS_IGNORING_CASE(name, "text"))
            text = SipReason::UNQUOTE(TRIM(parameter));
    }
    if (cause == 0)
        return;
    unsigned int& target = isQ850 ? reason.q850Cause : reason.sipCode;
    if (target == 0)
        target = cause;
    if (reason.text.empty())
        reason.text = text;
}
} // namespace

SipReason SipReason::PARSE(std::string_view value)
{
    SipReason reason;
    while (!value.empty())
        READ_VALUE(CUT(value, ','), reason);
    return reason;
}

std::string SipReason::ESCAPE(std::string_view text)
{
    std::string escaped;
    escaped.reserve(text.size());
    for (char const c : text)
    {
        auto const octet = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\')
            escaped += '\\';
        escaped += octet < 0x20 || octet == 0x7f ? ' ' : c;
    }
    return escaped;
}

std::string SipReason::UNQUOTE(std::string_view text)
{
    if (text.size() < 2 || text.front() != '"' || text.back() != '"')
        return std::string(text);
    text = text.substr(1, text.size() - 2);
    std::string plain;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        if (text[i] == '\\' && i + 1 < text.size())
            ++i;
        plain += text[i];
    }
    return plain;
}
