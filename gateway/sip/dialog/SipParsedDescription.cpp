#include "sip/dialog/SipParsedDescription.h"

#include <algorithm>

namespace
{
constexpr char const* SEPARATORS =
    "!\"()*,/:;<=>?@[\\]"; // of RFC 8866's token-char, those that are none; "/" is allowed

bool MAY_STAND_IN_MEDIA(char c)
{
    return c == ' ' || c == '/' || c == '\t' || c == '*' || c == '!' ||
           (c > ' ' && c < 0x7f && std::string_view(SEPARATORS).find(c) == std::string_view::npos);
}

/// The stack's parser never comes back from a stream with characters that none of its tokens may have, unless the
/// stream is RTP.
bool IS_SAFE(std::string_view description)
{
    for (std::size_t at = 0; at < description.size();)
    {
        std::size_t const end = std::min(description.find_first_of("\r\n", at), description.size());
        std::string_view const line = description.substr(at, end - at);
        if (line.size() > 2 && line[1] == '=' && (line[0] | 0x20) == 'm' &&
            !std::all_of(line.begin() + 2, line.end(), MAY_STAND_IN_MEDIA))
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
