#include "sip/message/SipCarriedHeaders.h"

#include "sip/message/SipText.h"
#include "sip/stack/SipHandles.h"

#include <sofia-sip/sip_header.h>

#include <algorithm>
#include <array>

namespace
{
using namespace SipCarriedHeaders;
using SipText::EQUALS_IGNORING_CASE;

struct Header
{
    std::string_view name;
    bool isInResponses;
    bool isForTrusted; ///< alone
    bool isTelling;    ///< perhaps who the party is
};

constexpr Header HEADERS[] = {
    {"Alert-Info", true, false, true},
    {"Call-Info", true, false, true},
    {"Subject", false, false, true},
    {"Priority", false, false, false},
    {"Session-ID", true, false, false},
    {"Geolocation", false, false, true},
    {"Geolocation-Routing", false, false, true},
    {"P-Early-Media", true, true, false},
    {"P-Charging-Vector", true, true, false},
};
constexpr Header LISTED{{}, true, false, true}; // nobody knows what it tells

/// What a dialog, a transaction, a body or this gateway's own view of the parties lives by.
constexpr std::string_view OWN[] = {"Accept",
                                    "Accept-Contact",
                                    "Accept-Encoding",
                                    "Allow",
                                    "Allow-Events",
                                    "Authentication-Info",
                                    "Authorization",
                                    "Call-ID",
                                    "Contact",
                                    "Content-Disposition",
                                    "Content-Encoding",
                                    "Content-Length",
                                    "Content-Type",
                                    "CSeq",
                                    "Date",
                                    "Diversion",
                                    "Event",
                                    "Expires",
                                    "From",
                                    "History-Info",
                                    "Identity",
                                    "Join",
                                    "Max-Forwards",
                                    "MIME-Version",
                                    "Min-Expires",
                                    "Min-SE",
                                    "P-Asserted-Identity",
                                    "P-Asserted-Service",
                                    "P-Associated-URI",
                                    "P-Called-Party-ID",
                                    "P-Preferred-Identity",
                                    "P-Profile-Key",
                                    "P-Served-User",
                                    "Path",
                                    "Privacy",
                                    "Proxy-Authenticate",
                                    "Proxy-Authentication-Info",
                                    "Proxy-Authorization",
                                    "Proxy-Require",
                                    "RAck",
                                    "Reason",
                                    "Record-Route",
                                    "Refer-To",
                                    "Referred-By",
                                    "Reject-Contact",
                                    "Remote-Party-ID",
                                    "Replaces",
                                    "Reply-To",
                                    "Request-Disposition",
                                    "Require",
                                    "Retry-After",
                                    "Route",
                                    "RSeq",
                                    "Security-Client",
                                    "Security-Server",
                                    "Security-Verify",
                                    "Service-Route",
                                    "Session-Expires",
                                    "Subscription-State",
                                    "Supported",
                                    "Timestamp",
                                    "To",
                                    "Unsupported",
                                    "User-to-User",
                                    "Via",
                                    "WWW-Authenticate"};

/// Null for one that stays on its side.
Header const* FIND(std::string_view name, Rules const& rules)
{
    for (Header const& header : HEADERS)
        if (EQUALS_IGNORING_CASE(header.name, name))
            return header.isForTrusted && !rules.isTrusted ? nullptr : &header;
    bool const isListed = std::any_of(rules.listed.begin(), rules.listed.end(),
                                      [&](std::string const& listed) { return EQUALS_IGNORING_CASE(listed, name); });
    return isListed ? &LISTED : nullptr;
}

bool IS_SHOWN(char c) { return !SipText::IS_CONTROL(c) || c == '\t'; }

/// Leaves out what would break out of its line or is too much.
class Lines
{
public:
    void add(std::string_view name, std::string_view value)
    {
        std::size_t const length = name.size() + value.size() + 4; // ": ", and the line break
        if (m_count == MOST_LINES || length > LONGEST_LINE || m_text.size() + length > MOST_OCTETS || value.empty() ||
            !std::all_of(value.begin(), value.end(), IS_SHOWN))
            return;
        m_text.append(name).append(": ").append(value).append("\r\n");
        ++m_count;
    }
    std::string take() { return std::move(m_text); }

private:
    std::string m_text;
    std::size_t m_count = 0;
};

/// Of headers that the stack does not know its name is in the header itself.
std::string_view NAME_OF(sip_header_t const* header)
{
    char const* const name =
        header->sh_class == sip_unknown_class ? header->sh_unknown->un_name : header->sh_class->hc_name;
    return name != nullptr ? std::string_view(name) : std::string_view();
}

void ADD(Lines& lines, sip_header_t const* header, std::string_view name)
{
    if (header->sh_class == sip_unknown_class)
    {
        char const* const value = header->sh_unknown->un_value;
        lines.add(name, SipText::TRIM(value != nullptr ? value : ""));
        return;
    }
    SipHome const home(su_home_create());
    char const* const value = sip_header_as_string(home.get(), header);
    lines.add(name, SipText::TRIM(value != nullptr ? value : ""));
}

sip_header_t const* FIRST_OF(sip_t const* message)
{
    return message->sip_request != nullptr ? reinterpret_cast<sip_header_t const*>(message->sip_request)
                                           : reinterpret_cast<sip_header_t const*>(message->sip_status);
}
} // namespace

std::string SipCarriedHeaders::READ(sip_t const* message, Rules const& rules)
{
    Lines lines;
    for (sip_header_t const* header = FIRST_OF(message); header != nullptr;
         header = reinterpret_cast<sip_header_t const*>(header->sh_succ))
        if (std::string_view const name = NAME_OF(header); !name.empty() && FIND(name, rules) != nullptr)
            ADD(lines, header, name);
    return lines.take();
}

std::string SipCarriedHeaders::FOR_PEER(std::string_view lines, Rules const& rules, Message message, bool isRestricted)
{
    Lines result;
    while (!lines.empty())
    {
        std::size_t const end = std::min(lines.find('\n'), lines.size());
        std::string_view value = lines.substr(0, end);
        lines.remove_prefix(std::min(end + 1, lines.size()));
        std::string_view const name = SipText::CUT(value, ':');
        Header const* const header = FIND(name, rules);
        if (header == nullptr || (message == RESPONSE && !header->isInResponses) ||
            (isRestricted && !rules.isTrusted && header->isTelling))
            continue;
        result.add(name, SipText::TRIM(value));
    }
    return result.take();
}

bool SipCarriedHeaders::IS_LISTABLE(std::string_view name)
{
    return SipText::IS_ONE_TOKEN(name) && name.size() > 1 && // one letter is another name's short form
           std::none_of(std::begin(OWN), std::end(OWN),
                        [&](std::string_view own) { return EQUALS_IGNORING_CASE(own, name); });
}
