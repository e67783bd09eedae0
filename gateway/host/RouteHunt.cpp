#include "host/RouteHunt.h"

RouteHunt::RouteHunt(Routing::Choices routes, std::string_view number, bool isRewritten)
    : m_routes(std::move(routes)), m_number(number), m_isRewritten(isRewritten)
{
    if (!take(0))
        m_routes.clear();
}

RouteHunt RouteHunt::TO(std::string const& provider, std::string_view number)
{
    Routing::Entry route;
    route.to = provider;
    return {{std::make_shared<Routing::Entry const>(std::move(route))}, number};
}

bool RouteHunt::goOn(unsigned int cause)
{
    return !isEmpty() && m_routes[m_present]->goesOnAfter(cause) && take(m_present + 1);
}

/// Of the routes from there on.
bool RouteHunt::take(std::size_t first)
{
    for (std::size_t i = first; i < m_routes.size(); ++i)
    {
        std::shared_ptr<RouteLoad> const& load = m_routes[i]->load;
        QCause const refusal = load != nullptr ? load->admit() : QCause::NONE;
        if (refusal != QCause::NONE)
        {
            m_refusal = refusal;
            continue;
        }
        m_place = load != nullptr ? std::make_shared<RouteLoad::Place>(load) : nullptr;
        m_present = i;
        return true;
    }
    return false;
}
