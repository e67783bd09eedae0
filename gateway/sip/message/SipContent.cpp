#include "sip/message/SipContent.h"

#include "sip/message/SipAdvice.h"

#include <algorithm>
#include <string_view>
#include <vector>

namespace
{
struct ContentPart
{
    std::string_view type;
    std::string_view disposition; // empty: that of its type
    std::string_view body;
};

/// No line of the parts may be taken for the boundary, whoever wrote them.
std::string BOUNDARY_FOR(std::vector<ContentPart> const& parts)
{
    std::string boundary = "part";
    while (std::any_of(parts.begin(), parts.end(),
                       [&](ContentPart const& part)
                       { return part.body.find("--" + boundary) != std::string_view::npos; }))
        boundary += '+';
    return boundary;
}
} // namespace

SipContent SipContent::OF(std::string const& session, std::string const& advice, SipIsup const& isup)
{
    std::vector<ContentPart> parts;
    if (!session.empty())
        parts.push_back({"application/sdp", {}, session});
    if (!advice.empty())
        parts.push_back({SipAdvice::TYPE, "render;handling=optional", advice});
    if (!isup.isEmpty())
        parts.push_back({isup.type, "signal;handling=optional", isup.body});
    if (parts.empty())
        return {};
    if (parts.size() == 1 && isup.isEmpty()) // which alone would have to be understood
        return {std::string(parts[0].type), std::string(parts[0].body)};
    std::string const boundary = BOUNDARY_FOR(parts);
    SipContent content{"multipart/mixed;boundary=\"" + boundary + "\"", {}};
    for (ContentPart const& part : parts)
    {
        content.body.append("--").append(boundary).append("\r\nContent-Type: ").append(part.type).append("\r\n");
        if (!part.disposition.empty())
            content.body.append("Content-Disposition: ").append(part.disposition).append("\r\n");
        content.body.append("\r\n").append(part.body).append("\r\n");
    }
    content.body.append("--").append(boundary).append("--\r\n");
    return content;
}

sip_payload_t SipContent::getPayload() const
{
    sip_payload_t payload;
    sip_payload_init(&payload);
    payload.pl_data = const_cast<char*>(body.data()); // the stack copies it
    payload.pl_len = static_cast<usize_t>(body.size());
    return payload;
}
