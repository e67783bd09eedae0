#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// Octets as hexadecimal digits, for command lines and files of examples.
namespace Hex
{
/// The octets that the text spells, two digits each in either case; nothing for any other text.
inline std::optional<std::vector<unsigned char>> READ(std::string_view text)
{
    auto const digit = [](char letter)
    {
        constexpr std::string_view DIGITS = "0123456789abcdef";
        return DIGITS.find(letter >= 'A' && letter <= 'F' ? static_cast<char>(letter - 'A' + 'a') : letter);
    };
    if (text.size() % 2 != 0)
        return std::nullopt;
    std::vector<unsigned char> octets;
    for (std::size_t i = 0; i < text.size(); i += 2)
    {
        std::size_t const high = digit(text[i]);
        std::size_t const low = digit(text[i + 1]);
        if (high == std::string_view::npos || low == std::string_view::npos)
            return std::nullopt;
        octets.push_back(static_cast<unsigned char>(high << 4 | low));
    }
    return octets;
}

/// The octets of any container, in capitals.
template <class Octets>
std::string WRITE(Octets const& octets)
{
    constexpr char const* DIGITS = "0123456789ABCDEF";
    std::string text;
    for (unsigned char const octet : octets)
    {
        text.push_back(DIGITS[octet / 16]);
        text.push_back(DIGITS[octet % 16]);
    }
    return text;
}
} // namespace Hex
