#pragma once

#include "host/Routing.h"

#include <string>
#include <string_view>

/// The routes of one call, one after the other, for the module on whose interface it comes in. A plain value; a reload
/// of the routes leaves it as it is.
///
///     RouteHunt hunt = host.findRoutes("a", called, calling, callNumber);
///     ... dial(hunt.getProvider(), hunt.getNumber())
///     if (hasReachedNobody && hunt.goOn(cause)) // that one was of no use: try the next
class RouteHunt
{
public:
    /// No route.
    RouteHunt() = default;
    RouteHunt(Routing::Choices routes, std::string_view number) : m_routes(std::move(routes)), m_number(number) {}
    /// To a provider that no route leads to.
    static RouteHunt TO(std::string const& provider, std::string_view number);

    bool isEmpty() const { return m_routes.empty(); }
    /// Of the present route, where there is one: on which provider the call leaves, and to which number. @{
    std::string const& getProvider() const { return m_routes[m_present]->to; }
    std::string getNumber() const { return m_routes[m_present]->shape(m_number); }
    bool isNumberShaped() const { return m_routes[m_present]->isShaping(); }
    /// @}
    /// Whether the present route names that cause (Q.850) and another one follows, which is the present one from now
    /// on.
    bool goOn(unsigned int cause);

private:
    Routing::Choices m_routes;
    std::string m_number; // as it came
    std::size_t m_present = 0;
};
