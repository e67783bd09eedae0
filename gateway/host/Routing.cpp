#include "host/Routing.h"

std::string const* Routing::find(std::string_view from, std::string_view number) const
{
    Configuration::Route const* best = nullptr;
    for (Configuration::Route const& route : m_routes)
        if (route.from == from && number.starts_with(route.prefix) &&
            (best == nullptr || route.prefix.size() > best->prefix.size()))
            best = &route;
    return best != nullptr ? &best->to : nullptr;
}
