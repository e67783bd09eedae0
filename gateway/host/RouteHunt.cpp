#include "host/RouteHunt.h"

RouteHunt RouteHunt::TO(std::string const& provider, std::string_view number)
{
    Route route;
    route.to = provider;
    return {{std::make_shared<Route const>(std::move(route))}, number};
}

bool RouteHunt::goOn(unsigned int cause)
{
    if (m_present + 1 >= m_routes.size() || !m_routes[m_present]->goesOnAfter(cause))
        return false;
    ++m_present;
    return true;
}
