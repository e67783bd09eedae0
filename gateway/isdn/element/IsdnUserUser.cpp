#include "isdn/element/IsdnUserUser.h"

#include "isdn/element/IsdnProperty.h"

#include <algorithm>

namespace
{
constexpr std::string_view DIGITS = "0123456789abcdef";
constexpr std::string_view IA5 = "04"; // protocol discriminator
constexpr unsigned int NO_DIGIT = 16;

unsigned int DIGIT_OF(char c)
{
    char const lower = c >= 'A' && c <= 'F' ? static_cast<char>(c - 'A' + 'a') : c;
    return static_cast<unsigned int>(std::min<std::size_t>(DIGITS.find(lower), NO_DIGIT));
}
} // namespace

CC_PropertyParametrizedString::ParametrizedString IsdnUserUser::FROM_WIRE(std::string_view text)
{
    std::string hex(IA5);
    for (char const c : text.substr(0, LONGEST))
    {
        auto const octet = static_cast<unsigned char>(c);
        (hex += DIGITS[octet >> 4]) += DIGITS[octet & 0x0f];
    }
    CC_PropertyParametrizedString::ParametrizedString content(IsdnProperty::STRING(hex));
    std::ignore = content.parameters.append({"encoding", "hex"}); // the default of RFC 7433
    return content;
}

std::string IsdnUserUser::TO_WIRE(CC_PropertyParametrizedString::ParametrizedString const& content)
{
    std::string_view hex = content.content.view();
    String const& encoding = content.getParameter("encoding");
    bool const isHex = encoding.isEmpty() || encoding == "hex";
    if (!isHex || !hex.starts_with(IA5) || hex.size() % 2 != 0 || hex.size() > 2 * (LONGEST + 1))
        return {};
    std::string text;
    for (hex.remove_prefix(2); !hex.empty(); hex.remove_prefix(2))
    {
        unsigned int const high = DIGIT_OF(hex[0]);
        unsigned int const low = DIGIT_OF(hex[1]);
        bool const isText = high < 8 && low < NO_DIGIT && (high | low) != 0;
        if (!isText)
            return {};
        text += static_cast<char>(high << 4 | low);
    }
    return text;
}
