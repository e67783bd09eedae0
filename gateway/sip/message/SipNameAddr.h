#pragma once

#include "sip/stack/Sofia.h"

#include <string>
#include <string_view>
#include <vector>

/// One address of a header: "Alice" <sip:4420@host;cause=302?Privacy=history>;index=1. A plain value.
///
///     for (SipNameAddr const& diverting : SipNameAddr::READ(request, "Diversion"))
///         diverting.getParameter("reason"); // "user-busy"
struct SipNameAddr
{
    std::string name;          ///< without quotes; may be empty
    std::string user;          ///< unescaped; of a tel URI its number; none of any but sip, sips and tel
    std::string host;          ///< empty for a tel URI
    std::string uriParameters; ///< "cause=302;x=y", as they stand
    std::string uriHeaders;    ///< "Privacy=history&x=y", as they stand
    std::string parameters;    ///< of the header: "index=1;x=y", as they stand

    /// The parts as the stack has parsed them; `display` and `parameters` may be null.
    static SipNameAddr OF(char const* display, url_t const& url, msg_param_t const* parameters);
    /// Every address with a sip, sips or tel URI in the headers of that name, which must be one that the stack does not
    /// parse by itself. From a malformed one on a line is passed over, and so is any other URI, which the log tells.
    static std::vector<SipNameAddr> READ(sip_t const* message, char const* header);

    /// Unquoted or unescaped; empty when absent.
    std::string getParameter(std::string_view parameter) const;
    std::string getUriParameter(std::string_view parameter) const;
    std::string getUriHeader(std::string_view header) const;
};
