#include "sip/message/SipContent.h"

#include "sip/message/SipAdvice.h"

namespace
{
constexpr char const* SESSION = "application/sdp";

/// No line of the parts may be taken for the boundary, whoever wrote them.
std::string BOUNDARY_FOR(std::string const& session, std::string const& advice)
{
    std::string boundary = "part";
    while (session.find("--" + boundary) != std::string::npos || advice.find("--" + boundary) != std::string::npos)
        boundary += '+';
    return boundary;
}
} // namespace

SipContent SipContent::OF(std::string const& session, std::string const& advice)
{
    if (session.empty() || advice.empty())
        return session.empty() && advice.empty() ? SipContent{}
               : advice.empty()                  ? SipContent{SESSION, session}
                                                 : SipContent{SipAdvice::TYPE, advice};
    std::string const boundary = BOUNDARY_FOR(session, advice);
    return {"multipart/mixed;boundary=\"" + boundary + "\"",
            "--" + boundary + "\r\nContent-Type: " + SESSION + "\r\n\r\n" + session + "\r\n--" + boundary +
                "\r\nContent-Type: " + SipAdvice::TYPE + "\r\nContent-Disposition: render;handling=optional\r\n\r\n" +
                advice + "\r\n--" + boundary + "--\r\n"};
}
