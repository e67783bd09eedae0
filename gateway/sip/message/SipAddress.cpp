#include "sip/message/SipAddress.h"

#include "sip/message/SipReason.h"
#include "sip/message/SipText.h"

#include <cctype>
#include <charconv>
#include <optional>

namespace
{
constexpr char const* HEXADECIMAL = "0123456789ABCDEF";
constexpr std::string_view ALLOWED_IN_USER = "-_.!~*'()&=+$,;?/";

/// What "%41" at that place stands for; nothing where no such escape is, or one of a control character.
std::optional<char> ESCAPED_AT(std::string_view text, std::size_t at)
{
    unsigned char octet = 0;
    std::string_view const digits = text.substr(at).substr(0, 3);
    if (digits.size() < 3 || digits[0] != '%')
        return std::nullopt;
    bool const isNumber = std::from_chars(digits.data() + 1, digits.data() + 3, octet, 16).ptr == digits.data() + 3;
    auto const c = static_cast<char>(octet);
    return isNumber && !SipText::IS_CONTROL(c) ? std::optional(c) : std::nullopt;
}
} // namespace

std::string SipAddress::UNESCAPE_USER(std::string_view user)
{
    std::string plain;
    for (std::size_t i = 0; i < user.size(); ++i)
        if (std::optional<char> const escaped = ESCAPED_AT(user, i))
        {
            plain += *escaped;
            i += 2;
        }
        else
            plain += user[i];
    return plain;
}

std::string SipAddress::ESCAPE_USER(std::string_view user)
{
    std::string escaped;
    for (char const c : user)
    {
        auto const octet = static_cast<unsigned char>(c);
        if ((octet < 0x80 && std::isalnum(octet) != 0) || ALLOWED_IN_USER.find(c) != std::string_view::npos)
            escaped += c;
        else
        {
            escaped += '%';
            escaped += HEXADECIMAL[octet >> 4];
            escaped += HEXADECIMAL[octet & 0xf];
        }
    }
    return escaped;
}

std::string SipAddress::MAKE_URI(std::string_view user, SocketAddress const& address, SipWay::Way way)
{
    std::string uri = way == SipWay::SIPS ? "sips:" : "sip:";
    if (!user.empty())
        uri += ESCAPE_USER(user) + "@";
    uri += address.text();
    if (way == SipWay::TCP)
        uri += ";transport=tcp";
    else if (way == SipWay::TLS)
        uri += ";transport=tls";
    else if (way == SipWay::UDP && address.isName())
        uri += ";transport=udp"; // else the resolver would choose
    return uri;
}

std::string SipAddress::MAKE_NAME_ADDR(std::string_view displayName, std::string_view uri)
{
    std::string result;
    if (!displayName.empty())
        result.append(1, '"').append(SipReason::ESCAPE(displayName)).append("\" ");
    return result.append(1, '<').append(uri).append(1, '>');
}
