#include "sip/message/SipIsup.h"

#include "sip/message/SipText.h"

#include <algorithm>
#include <charconv>

namespace
{
constexpr std::size_t LONGEST_TYPE = 200; // octets
}

bool SipIsup::IS_TYPE(std::string_view contentType)
{
    bool const isSound =
        contentType.size() <= LONGEST_TYPE && std::none_of(contentType.begin(), contentType.end(), SipText::IS_CONTROL);
    return isSound && SipText::EQUALS_IGNORING_CASE(SipText::CUT(contentType, ';'), "application/isup");
}

std::string SipIsup::getText() const
{
    constexpr std::string_view DIGITS = "0123456789abcdef";
    std::string text = type + "\n";
    for (char const c : body)
    {
        auto const octet = static_cast<unsigned char>(c);
        text += DIGITS[octet >> 4];
        text += DIGITS[octet & 0xf];
    }
    return text;
}

SipIsup SipIsup::OF_TEXT(std::string_view text)
{
    std::size_t const end = text.find('\n');
    if (end == std::string_view::npos)
        return {};
    SipIsup isup{std::string(text.substr(0, end)), {}};
    for (std::string_view rest = text.substr(end + 1); !rest.empty(); rest.remove_prefix(2))
    {
        unsigned char octet = 0;
        std::string_view const digits = rest.substr(0, 2);
        if (digits.size() < 2 || std::from_chars(digits.data(), digits.data() + 2, octet, 16).ptr != digits.data() + 2)
            return {};
        isup.body += static_cast<char>(octet);
    }
    return isup;
}
