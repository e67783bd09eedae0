#include "sip/registrar/SipPath.h"

#include "sip/stack/SipHandles.h"

namespace
{
constexpr std::size_t LONGEST_ROUTE = 1024; // octets, for each contact of everybody who registers
} // namespace

std::optional<std::string> SipPath::READ(sip_t const* request)
{
    SipHome const home(su_home_create());
    std::string route;
    for (sip_path_t const* proxy = request->sip_path; proxy != nullptr; proxy = proxy->r_next)
    {
        char const* const text = sip_header_as_string(home.get(), reinterpret_cast<sip_header_t const*>(proxy));
        if (text == nullptr || !url_has_param(proxy->r_url, "lr"))
            return std::nullopt;
        route += (route.empty() ? "" : ", ") + std::string(text);
        if (route.size() > LONGEST_ROUTE)
            return std::nullopt;
    }
    return route;
}

std::string SipPath::GET_HEADER(sip_t const* request, std::string const& route)
{
    bool const isUnderstood = sip_has_feature(request->sip_supported, "path") != 0;
    return isUnderstood && !route.empty() ? "Path: " + route + "\r\n" : std::string();
}
