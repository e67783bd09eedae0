#include "sip/dialog/SipDescription.h"

#include "sip/stack/SipHandles.h"

#include <algorithm>
#include <memory>
#include <sofia-sip/sdp.h>

namespace
{
struct ParserDeleter
{
    void operator()(sdp_parser_t* parser) const { sdp_parser_free(parser); }
};
struct PrinterDeleter
{
    void operator()(sdp_printer_t* printer) const { sdp_printer_free(printer); }
};

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

/// A description and the memory that it is in.
class Parsed
{
public:
    explicit Parsed(std::string_view description)
    {
        if (!IS_SAFE(description))
            return;
        m_home.reset(su_home_create());
        m_parser.reset(sdp_parse(m_home.get(), description.data(), static_cast<issize_t>(description.size()),
                                 sdp_f_mode_0000 | sdp_f_c_missing));
        m_session = sdp_session(m_parser.get());
    }
    sdp_session_t* get() const { return m_session; }
    su_home_t* getHome() const { return m_home.get(); }

private:
    SipHome m_home;
    std::unique_ptr<sdp_parser_t, ParserDeleter> m_parser; // its memory is the home's
    sdp_session_t* m_session = nullptr;
};
} // namespace

bool SipDescription::IS_READABLE(std::string_view description) { return Parsed(description).get() != nullptr; }

bool SipDescription::IS_HOLD(std::string_view description)
{
    Parsed const parsed(description);
    bool hasVoice = false;
    for (sdp_media_t const* media = parsed.get() != nullptr ? parsed.get()->sdp_media : nullptr; media != nullptr;
         media = media->m_next)
    {
        if (media->m_type != sdp_media_audio || media->m_rejected)
            continue;
        if ((media->m_mode & sdp_recvonly) != 0)
            return false;
        hasVoice = true;
    }
    return hasVoice;
}

std::string SipDescription::REFUSING(std::string_view offer)
{
    Parsed const parsed(offer);
    if (parsed.get() == nullptr)
        return {};
    for (sdp_media_t* media = parsed.get()->sdp_media; media != nullptr; media = media->m_next)
    {
        media->m_port = 0;
        media->m_rejected = 1;
    }
    std::unique_ptr<sdp_printer_t, PrinterDeleter> const printer(
        sdp_print(parsed.getHome(), parsed.get(), nullptr, 0, sdp_f_realloc));
    char const* const text = sdp_message(printer.get());
    return text != nullptr ? std::string(text, static_cast<std::size_t>(sdp_message_size(printer.get())))
                           : std::string();
}
