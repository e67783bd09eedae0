#include "SipAddress.h"

#include "sip/SipReason.h"

#include <cctype>
#include <charconv>

namespace
{
constexpr char const* HEXADECIMAL = "0123456789ABCDEF";
constexpr std::string_view ALLOWED_IN_USER = "-_.!~*'()&=+$,;?/";
} // namespace

std::string SipAddress::UNESCAPE_USER(std::string_view user)
{
    std::string plain;
    for (std::size_t i = 0; i < user.size(); ++i)
    {
        unsigned char octet = 0;
        if (user[i] == '%' && i + 2 < user.size() && std::isxdigit(static_cast<unsigned char>(user[i + 1])) != 0 &&
            std::isxdigit(static_cast<unsigned char>(user[i + 2])) != 0)
        {
            std::from_chars(user.data() + i + 1, user.data() + i + 3, octet, 16);
            plain += static_cast<char>(octet);
            i += 2;
        }
        else
            plain += user[i];
    }
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

std::string SipAddress::MAKE_URI(std::string_view user, SocketAddress const& address, bool usesTcp)
{
    std::string uri = "sip:";
    if (!user.empty())
        uri += ESCAPE_USER(user) + "@";
    uri += address.text();
    if (usesTcp)
        uri += ";transport=tcp";
    return uri;
}

std::string SipAddress::MAKE_NAME_ADDR(std::string_view displayName, std::string_view uri)
{
    std::string result;
    if (!displayName.empty())
        result.append(1, '"').append(SipReason::ESCAPE(displayName)).append("\" ");
    return result.append(1, '<').append(uri).append(1, '>');
}
