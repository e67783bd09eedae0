#include "isdn/element/IsdnText.h"

namespace
{
constexpr unsigned char FIRST_PRINTED = 0x20;
constexpr unsigned char DELETE = 0x7f;
constexpr unsigned char LAST_CONTROL = 0x9f; // of the upper half
constexpr unsigned int LAST_LATIN = 0xff;

/// Reads one character of UTF-8 and takes it away; 0 for what is none, of which one octet is taken.
unsigned int TAKE(std::string_view& text)
{
    auto const first = static_cast<unsigned char>(text.front());
    std::size_t const length = first < 0x80 ? 1 : first >= 0xf0 ? 4 : first >= 0xe0 ? 3 : first >= 0xc2 ? 2 : 0;
    unsigned int code = length == 1 ? first : first & (0xffu >> (length + 1));
    bool isValid = length != 0 && length <= text.size() && first < 0xf5;
    for (std::size_t i = 1; isValid && i < length; ++i)
    {
        auto const next = static_cast<unsigned char>(text[i]);
        isValid = (next & 0xc0) == 0x80;
        code = code << 6 | (next & 0x3fu);
    }
    text.remove_prefix(isValid ? length : 1);
    return isValid ? code : 0;
}

bool IS_UTF8(std::string_view text)
{
    while (!text.empty())
        if (TAKE(text) == 0)
            return false;
    return true;
}

bool IS_CONTROL(unsigned int code) { return code < FIRST_PRINTED || (code >= DELETE && code <= LAST_CONTROL); }
} // namespace

std::string IsdnText::TO_WIRE(std::string_view text, std::size_t longest)
{
    std::string wire;
    while (!text.empty() && wire.size() < longest)
    {
        unsigned int const code = TAKE(text);
        wire += code > LAST_LATIN || code == 0 ? '?' : IS_CONTROL(code) ? ' ' : static_cast<char>(code);
    }
    return wire;
}

std::string IsdnText::FROM_WIRE(std::string_view text)
{
    bool const isUtf8 = IS_UTF8(text);
    std::string result;
    for (char const c : text)
    {
        auto const octet = static_cast<unsigned char>(c);
        if (octet < FIRST_PRINTED || octet == DELETE || (!isUtf8 && IS_CONTROL(octet)))
            result += ' ';
        else if (octet < 0x80 || isUtf8)
            result += c;
        else
            (result += static_cast<char>(0xc0 | octet >> 6)) += static_cast<char>(0x80 | (octet & 0x3f));
    }
    return result;
}
