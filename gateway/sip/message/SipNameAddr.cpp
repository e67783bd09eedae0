#include "sip/message/SipNameAddr.h"

#include "sip/message/SipAddress.h"
#include "sip/message/SipReason.h"
#include "sip/message/SipText.h"
#include "sip/stack/SipHandles.h"

#include <spdlog/spdlog.h>

#include <strings.h>

namespace
{
std::string TEXT_OF(char const* text) { return text != nullptr ? text : ""; }

bool NAMES_A_PARTY(url_t const& url)
{
    return url.url_type == url_sip || url.url_type == url_sips || url.url_type == url_tel;
}

/// Takes the comma, which ends the address before it, and whatever is between that and the next.
bool TAKE_SEPARATOR(char*& rest)
{
    if (*rest != ',')
        return *rest == '\0';
    *rest++ = '\0'; // the parameters of the address before it end here and nowhere else
    while (*rest == ',' || *rest == ' ' || *rest == '\t' || *rest == '\r' || *rest == '\n')
        ++rest;
    return true;
}

/// False if something was passed over.
bool READ_LINE(char const* value, std::vector<SipNameAddr>& all)
{
    bool isSound = true;
    SipHome const home(su_home_create());
    char* rest = su_strdup(home.get(), value);
    while (rest != nullptr && *rest != '\0')
    {
        char const* display = nullptr;
        url_t url = {};
        msg_param_t const* parameters = nullptr;
        if (sip_name_addr_d(home.get(), &rest, &display, &url, &parameters, nullptr) < 0 || !TAKE_SEPARATOR(rest))
            return false;
        if (NAMES_A_PARTY(url))
            all.push_back(SipNameAddr::OF(display, url, parameters));
        else
            isSound = false;
    }
    return isSound;
}
} // namespace

SipNameAddr SipNameAddr::OF(char const* display, url_t const& url, msg_param_t const* parameters)
{
    SipNameAddr address;
    address.name = SipReason::UNQUOTE(SipText::TRIM(display != nullptr ? display : ""));
    if (NAMES_A_PARTY(url))
        address.user = SipAddress::UNESCAPE_USER(TEXT_OF(url.url_user));
    address.host = TEXT_OF(url.url_host);
    address.uriParameters = TEXT_OF(url.url_params);
    address.uriHeaders = TEXT_OF(url.url_headers);
    for (; parameters != nullptr && *parameters != nullptr; ++parameters)
        address.parameters.append(address.parameters.empty() ? "" : ";").append(*parameters);
    return address;
}

std::vector<SipNameAddr> SipNameAddr::READ(sip_t const* message, char const* header)
{
    std::vector<SipNameAddr> all;
    bool isSound = true;
    for (sip_unknown_t const* line = message->sip_unknown; line != nullptr; line = line->un_next)
        if (strcasecmp(line->un_name, header) == 0)
            isSound = READ_LINE(line->un_value, all) && isSound;
    if (!isSound) // one line for all, and without the text: it may be withheld
        spdlog::info("{} is passed over where it is malformed", header);
    return all;
}

std::string SipNameAddr::getParameter(std::string_view parameter) const
{
    return SipReason::UNQUOTE(SipText::FIND_PARAMETER(parameters, ';', parameter));
}

std::string SipNameAddr::getUriParameter(std::string_view parameter) const
{
    return SipAddress::UNESCAPE_USER(SipText::FIND_PARAMETER(uriParameters, ';', parameter));
}

std::string SipNameAddr::getUriHeader(std::string_view header) const
{
    return SipAddress::UNESCAPE_USER(SipText::FIND_PARAMETER(uriHeaders, '&', header));
}
