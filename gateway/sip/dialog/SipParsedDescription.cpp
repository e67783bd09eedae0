#include "sip/dialog/SipParsedDescription.h"

#include "sip/message/SipText.h"

#include <algorithm>

namespace
{
constexpr std::string_view DIGITS = "0123456789";
constexpr std::string_view LETTERS = "0123456789abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ-._+*";

/// Words of those characters, with a stroke between every two.
bool ARE_WORDS(std::string_view text, std::string_view characters, bool mayHaveMany)
{
    for (;;)
    {
        std::size_t const end = std::min(text.find_first_not_of(characters), text.size());
        if (end == 0 || (end < text.size() && (text[end] != '/' || !mayHaveMany)))
            return false;
        if (end == text.size())
            return true;
        text.remove_prefix(end + 1);
    }
}

/// As in "audio 4000/2 RTP/AVP 8 0".
bool IS_SAFE_MEDIA(std::string_view line)
{
    unsigned int field = 0;
    for (; !line.empty(); ++field)
    {
        std::string_view const text = line.substr(0, line.find(' '));
        if (!ARE_WORDS(text, field == 1 ? DIGITS : LETTERS, field == 1 || field == 2))
            return false;
        line.remove_prefix(std::min(text.size() + 1, line.size()));
    }
    return field >= 4;
}

/// The stack's parser never comes back from a stream, unless it is RTP, when characters are left that are in none of
/// its tokens. RFC 8866 has more of them than are used anywhere; they make a description unreadable.
bool IS_SAFE(std::string_view description)
{
    for (std::size_t at = 0; at < description.size();)
    {
        std::size_t const end = std::min(description.find_first_of("\r\n", at), description.size());
        std::string_view const line = SipText::TRIM(description.substr(at, end - at)); // as the parser begins a line
        if (line.size() > 2 && line[1] == '=' && (line[0] | 0x20) == 'm' && !IS_SAFE_MEDIA(line.substr(2)))
            return false;
        at = end + 1;
    }
    return description.find('\0') == std::string_view::npos;
}
} // namespace

SipParsedDescription::SipParsedDescription(std::string_view description)
{
    if (!IS_SAFE(description))
        return;
    m_home.reset(su_home_create());
    m_parser.reset(sdp_parse(m_home.get(), description.data(), static_cast<issize_t>(description.size()),
                             sdp_f_mode_0000 | sdp_f_c_missing));
    m_session = sdp_session(m_parser.get());
}

std::string SipParsedDescription::print() const
{
    std::unique_ptr<sdp_printer_t, Deleter> const printer(
        sdp_print(m_home.get(), m_session, nullptr, 0, sdp_f_realloc));
    char const* const text = sdp_message(printer.get());
    return text != nullptr ? std::string(text, static_cast<std::size_t>(sdp_message_size(printer.get())))
                           : std::string();
}
