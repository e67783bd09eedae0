#pragma once

#include <array>
#include <cstdio>
#include <string>
#include <string_view>

/// The text, with every character that would steer a terminal as "\x1b".
inline std::string SAFE_TEXT(std::string_view text)
{
    std::string out;
    for (char const c : text)
    {
        auto const octet = static_cast<unsigned char>(c);
        if (octet >= 0x20 && octet != 0x7f)
        {
            out += c;
            continue;
        }
        std::array<char, 8> escape;
        std::snprintf(escape.data(), escape.size(), "\\x%02x", unsigned{octet});
        out += escape.data();
    }
    return out;
}
