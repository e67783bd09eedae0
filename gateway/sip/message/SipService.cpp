#include "sip/message/SipService.h"

#include "sip/message/SipText.h"
#include "sip/stack/SipHandles.h"

#include <algorithm>
#include <cctype>

namespace
{
constexpr std::string_view EMERGENCY = "urn:service:sos";
constexpr std::size_t LONGEST = 100;

bool IS_OF_LABEL(char c)
{
    auto const octet = static_cast<unsigned char>(c);
    return octet < 0x80 && (std::isalnum(octet) != 0 || c == '-' || c == '.');
}
} // namespace

std::string SipService::READ(url_t const& uri)
{
    if (uri.url_scheme == nullptr || !SipText::EQUALS_IGNORING_CASE(uri.url_scheme, "urn"))
        return {};
    SipHome const home(su_home_create());
    char const* const text = url_as_string(home.get(), &uri);
    std::string number = text != nullptr ? text : "";
    std::transform(number.begin(), number.end(), number.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return IS_ONE(number) ? number : std::string();
}

bool SipService::IS_ONE(std::string_view number)
{
    if (!number.starts_with(EMERGENCY) || number.size() > LONGEST)
        return false;
    number.remove_prefix(EMERGENCY.size());
    return number.empty() || (number.front() == '.' && std::all_of(number.begin(), number.end(), IS_OF_LABEL));
}
