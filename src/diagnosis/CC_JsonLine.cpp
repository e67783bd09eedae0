#include "diagnosis/CC_JsonLine.h"

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstring>

namespace
{
constexpr std::size_t ROOM = 480;
constexpr std::string_view REPLACEMENT = "\xef\xbf\xbd"; // U+FFFD

unsigned char OCTET(char c) { return static_cast<unsigned char>(c); }

/// The octets of the UTF-8 character that the text begins with (RFC 3629); 0 when it begins with none.
std::size_t LENGTH_OF_FIRST(std::string_view text)
{
    unsigned char const lead = OCTET(text[0]);
    if (lead < 0x80)
        return 1;
    std::size_t const length = lead >= 0xc2 && lead < 0xe0   ? 2
                               : lead >= 0xe0 && lead < 0xf0 ? 3
                               : lead >= 0xf0 && lead < 0xf5 ? 4
                                                             : 0;
    if (length == 0 || text.size() < length)
        return 0;
    for (std::size_t i = 1; i < length; ++i)
        if ((OCTET(text[i]) & 0xc0) != 0x80)
            return 0;
    unsigned char const second = OCTET(text[1]);
    bool const isTooLong = (lead == 0xe0 && second < 0xa0) || (lead == 0xf0 && second < 0x90);
    bool const isNone = (lead == 0xed && second >= 0xa0) || (lead == 0xf4 && second >= 0x90);
    return isTooLong || isNone ? 0 : length;
}

void APPEND_ESCAPED(std::string& out, char c)
{
    if (c == '"' || c == '\\')
        (out += '\\') += c;
    else if (OCTET(c) < 0x20 || c == 0x7f)
    {
        std::array<char, 8> escape;
        std::snprintf(escape.data(), escape.size(), "\\u%04x", unsigned{OCTET(c)});
        out += escape.data();
    }
    else
        out += c;
}

bool IS_PLAIN(char c) { return OCTET(c) >= 0x20 && OCTET(c) < 0x7f && c != '"' && c != '\\'; }

/// The same of eight characters at once, which most texts are looked at by: false also for some that are plain.
bool ARE_PLAIN(char const* eight)
{
    constexpr std::uint64_t ONES = 0x0101010101010101;
    constexpr std::uint64_t HIGHEST = 0x80 * ONES;
    std::uint64_t word = 0;
    std::memcpy(&word, eight, sizeof word);
    auto const hasZero = [](std::uint64_t octets) { return (octets - ONES) & ~octets; };
    std::uint64_t const isLow = (word - 0x20 * ONES) & ~word;
    std::uint64_t const isHigh = word | (word + ONES); // 0x7f and above
    return ((isLow | isHigh | hasZero(word ^ '"' * ONES) | hasZero(word ^ '\\' * ONES)) & HIGHEST) == 0;
}

/// How many plain characters the text begins with.
std::size_t PLAIN_LENGTH(std::string_view text)
{
    std::size_t length = 0;
    while (length + 8 <= text.size() && ARE_PLAIN(text.data() + length))
        length += 8;
    while (length < text.size() && IS_PLAIN(text[length]))
        ++length;
    return length;
}

void APPEND_QUOTED(std::string& out, std::string_view text)
{
    out += '"';
    while (!text.empty())
    {
        std::size_t const plain = PLAIN_LENGTH(text);
        out += text.substr(0, plain);
        text.remove_prefix(plain);
        if (text.empty())
            break;
        std::size_t const length = LENGTH_OF_FIRST(text);
        if (length == 1)
            APPEND_ESCAPED(out, text[0]);
        else
            out += length == 0 ? REPLACEMENT : text.substr(0, length);
        text.remove_prefix(length == 0 ? 1 : length);
    }
    out += '"';
}

void APPEND_NAME(std::string& out, std::string_view name)
{
    if (out.size() > 1)
        out += ',';
    else
        out.reserve(ROOM); // of most lines
    APPEND_QUOTED(out, name);
    out += ':';
}
} // namespace

std::string CC_JsonLine::QUOTED(std::string_view text)
{
    std::string out;
    out.reserve(text.size() + 2);
    APPEND_QUOTED(out, text);
    return out;
}

CC_JsonLine& CC_JsonLine::add(std::string_view name, std::string_view text)
{
    APPEND_NAME(m_text, name);
    APPEND_QUOTED(m_text, text);
    return *this;
}

CC_JsonLine& CC_JsonLine::add(std::string_view name, unsigned long long number)
{
    return addJson(name, std::to_string(number));
}

CC_JsonLine& CC_JsonLine::addJson(std::string_view name, std::string_view json)
{
    APPEND_NAME(m_text, name);
    m_text += json;
    return *this;
}
