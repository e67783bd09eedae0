#include "sip/message/SipBody.h"

#include "sip/message/SipAdvice.h"
#include "sip/message/SipReason.h"
#include "sip/message/SipText.h"

#include <optional>
#include <tuple>

namespace
{
constexpr unsigned int DEEPEST = 4;     // multiparts inside each other
constexpr unsigned int MOST_PARTS = 32; // more are an attack

std::string_view TEXT_OF(char const* text) { return text != nullptr ? text : std::string_view(); }

/// "application/sdp" of "Application/SDP ; charset=x" is what the text is compared with.
bool IS_TYPE(std::string_view value, char const* type)
{
    return SipText::EQUALS_IGNORING_CASE(SipText::CUT(value, ';'), type);
}

bool IS_IDENTITY(std::string_view encoding)
{
    return encoding.empty() || SipText::IS_ONE_OF(encoding, {"identity", "binary", "8bit", "7bit"});
}

bool IS_OPTIONAL(std::string_view disposition)
{
    SipText::CUT(disposition, ';');
    return SipText::EQUALS_IGNORING_CASE(SipText::FIND_PARAMETER(disposition, ';', "handling"), "optional");
}

/// A description without a disposition is one of a session.
bool IS_OF_SESSION(std::string_view disposition)
{
    return disposition.empty() || SipText::EQUALS_IGNORING_CASE(SipText::CUT(disposition, ';'), "session");
}

/// Cuts the text up to a line's end off, and the end.
std::string_view CUT_LINE(std::string_view& rest)
{
    std::size_t const end = rest.find('\n');
    std::string_view line = rest.substr(0, end);
    rest.remove_prefix(end == std::string_view::npos ? rest.size() : end + 1);
    if (line.ends_with('\r'))
        line.remove_suffix(1);
    return line;
}

/// One part of a multipart: its headers and what follows them.
struct Part
{
    std::string_view type;
    std::string_view encoding;
    std::string_view disposition;
    std::string_view body;

    static Part OF(std::string_view text)
    {
        Part part;
        for (;;)
        {
            std::string_view line = CUT_LINE(text);
            if (line.empty())
                break; // of the headers, which may be none
            std::string_view const name = SipText::CUT(line, ':');
            if (SipText::IS_ONE_OF(name, {"Content-Type", "c"}))
                part.type = SipText::TRIM(line);
            else if (SipText::IS_ONE_OF(name, {"Content-Encoding", "e", "Content-Transfer-Encoding"}) &&
                     IS_IDENTITY(part.encoding))
                part.encoding = SipText::TRIM(line);
            else if (SipText::EQUALS_IGNORING_CASE(name, "Content-Disposition"))
                part.disposition = SipText::TRIM(line);
        }
        part.body = text;
        return part;
    }
};

/// Goes through what stands between the lines of a boundary.
class Parts
{
public:
    Parts(std::string_view body, std::string const& boundary) : m_rest(body), m_delimiter("--" + boundary)
    {
        std::ignore = cutToDelimiter(); // what stands before the first is for nobody
    }

    std::optional<std::string_view> next()
    {
        if (m_isOver)
            return std::nullopt;
        return cutToDelimiter();
    }
    /// Whether the last boundary was seen, which says that nothing is missing.
    bool isComplete() const { return m_isComplete; }

private:
    std::optional<std::string_view> cutToDelimiter()
    {
        std::string_view const text = m_rest;
        while (!m_rest.empty())
        {
            std::size_t const begin = text.size() - m_rest.size();
            std::string_view line = CUT_LINE(m_rest);
            if (!line.starts_with(m_delimiter))
                continue;
            line.remove_prefix(m_delimiter.size());
            bool const isLast = line.starts_with("--");
            if (!SipText::TRIM(isLast ? line.substr(2) : line).empty())
                continue; // a longer boundary, of somebody else's
            m_isOver = m_isComplete = isLast;
            return withoutLineEnd(text.substr(0, begin));
        }
        m_isOver = true;
        return std::nullopt;
    }
    /// The line's end before a boundary belongs to it.
    static std::string_view withoutLineEnd(std::string_view text)
    {
        if (text.ends_with('\n'))
            text.remove_suffix(1);
        if (text.ends_with('\r'))
            text.remove_suffix(1);
        return text;
    }

    std::string_view m_rest;
    std::string m_delimiter;
    bool m_isOver = false;
    bool m_isComplete = false;
};

SipBody READ_PARTS(std::string_view body, std::string_view type, bool isAlternative, bool takesIsup, unsigned int depth)
{
    SipText::CUT(type, ';');
    std::string const boundary = SipReason::UNQUOTE(SipText::FIND_PARAMETER(type, ';', "boundary"));
    SipBody result;
    if (boundary.empty() || depth >= DEEPEST)
        return {{}, SipBody::TYPE};
    Parts parts(body, boundary);
    bool isOneUnderstood = false;
    for (unsigned int number = 0; std::optional<std::string_view> const text = parts.next(); ++number)
    {
        if (number == MOST_PARTS)
            return {{}, SipBody::TYPE};
        Part const part = Part::OF(*text);
        SipBody const read = SipBody::READ(part.body, part.type, part.encoding, part.disposition, takesIsup, depth + 1);
        isOneUnderstood = isOneUnderstood || read.isUnderstood();
        if (!read.isUnderstood())
            result.obstacle = read.obstacle;
        else if (!read.session.empty() && (isAlternative || result.session.empty()))
            result.session = read.session;
        if (read.isUnderstood() && result.advice.empty())
            result.advice = read.advice;
        if (read.isUnderstood() && result.isup.isEmpty())
            result.isup = read.isup;
    }
    if (!parts.isComplete())
        return {{}, SipBody::TYPE};
    if (isAlternative && isOneUnderstood)
        result.obstacle = SipBody::NONE;
    if (!result.isUnderstood())
        result.session.clear();
    return result;
}
} // namespace

SipBody SipBody::READ(std::string_view body, std::string_view type, std::string_view encoding,
                      std::string_view disposition, bool takesIsup, unsigned int depth)
{
    if (body.empty())
        return {};
    SipBody result{{}, TYPE};
    bool const isSession = IS_TYPE(type, "application/sdp") && IS_OF_SESSION(disposition);
    bool const isAlternative = IS_TYPE(type, "multipart/alternative");
    bool const isMultipart = isAlternative || IS_TYPE(type, "multipart/mixed");
    if ((isSession || isMultipart) && !IS_IDENTITY(encoding))
        result.obstacle = ENCODING;
    else if (isSession)
        result = {std::string(body), NONE};
    else if (SipAdvice::IS_TYPE(type) && IS_IDENTITY(encoding))
        result = {{}, NONE, std::string(body)};
    else if (takesIsup && SipIsup::IS_TYPE(type) && IS_IDENTITY(encoding))
        result = {{}, NONE, {}, {std::string(type), std::string(body)}};
    else if (isMultipart)
        result = READ_PARTS(body, type, isAlternative, takesIsup, depth);
    if (IS_OPTIONAL(disposition))
        result.obstacle = NONE;
    return result;
}

namespace
{
/// A header's value as it stood, for those of which only the parsed form is there.
std::string WITH_PARAMETERS(char const* value, msg_param_t const* parameters)
{
    std::string text(TEXT_OF(value));
    for (; parameters != nullptr && *parameters != nullptr; ++parameters)
        text.append(";").append(*parameters);
    return text;
}
} // namespace

SipBody SipBody::READ(sip_t const* message, bool takesIsup)
{
    if (message->sip_payload == nullptr || message->sip_payload->pl_data == nullptr)
        return {};
    std::string_view const body(message->sip_payload->pl_data, message->sip_payload->pl_len);
    sip_content_type_t const* const type = message->sip_content_type;
    sip_content_disposition_t const* const disposition = message->sip_content_disposition;
    std::string encoding;
    for (sip_content_encoding_t const* header = message->sip_content_encoding; header != nullptr;
         header = header->k_next)
        for (msg_param_t const* item = header->k_items; item != nullptr && *item != nullptr; ++item)
            encoding.append(encoding.empty() ? "" : ",").append(*item);
    if (type != nullptr && disposition == nullptr && encoding.empty() &&
        IS_TYPE(TEXT_OF(type->c_type), "application/sdp"))
        return {std::string(body), NONE}; // most are
    return READ(body, type != nullptr ? WITH_PARAMETERS(type->c_type, type->c_params) : "", encoding,
                disposition != nullptr ? WITH_PARAMETERS(disposition->cd_type, disposition->cd_params) : "", takesIsup);
}

std::string SipBody::PAYLOAD_OF(sip_t const* message)
{
    if (message->sip_payload == nullptr || message->sip_payload->pl_data == nullptr)
        return {};
    return std::string(message->sip_payload->pl_data, message->sip_payload->pl_len);
}
