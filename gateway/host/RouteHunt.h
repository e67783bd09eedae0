#pragma once

#include "host/Routing.h"

#include <memory>
#include <string>
#include <string_view>

/// The routes of one call, one after the other, for the module on whose interface it comes in. A plain value, whose
/// copies are of the same call; a reload of the routes leaves it as it is. While it is there, and until `leave`, the
/// call counts among those of its present route.
///
///     RouteHunt hunt = host.findRoutes("a", called, calling, callNumber);
///     if (hunt.isEmpty())
///         ... // refused, with hunt.getRefusal()
///     ... dial(hunt.getProvider(), hunt.getNumber())
///     if (hasReachedNobody && hunt.goOn(cause)) // that one was of no use: try the next
class RouteHunt
{
public:
    /// No route.
    RouteHunt() = default;
    /// The first of them that has room. `isRewritten`: the number is not the one that came in. Throws std::bad_alloc.
    RouteHunt(Routing::Choices routes, std::string_view number, bool isRewritten = false);
    /// To a provider that no route leads to.
    static RouteHunt TO(std::string const& provider, std::string_view number);

    bool isEmpty() const { return m_routes.empty(); }
    /// Why there is none: NO_ROUTE_TO_DESTINATION, or what RouteLoad::admit said of the last one.
    QCause getRefusal() const { return m_refusal; }
    /// Of the present route, where there is one: on which provider the call leaves, and to which number; whether that
    /// is another one than came in; whether nothing may refuse the call. @{
    std::string const& getProvider() const { return m_routes[m_present]->to; }
    std::string getNumber() const { return m_routes[m_present]->shape(m_number); }
    bool isNumberShaped() const { return m_isRewritten || m_routes[m_present]->isShaping(); }
    bool isEmergency() const { return !isEmpty() && m_routes[m_present]->isEmergency; }
    /// @}
    /// Whether the present route names that cause (Q.850) and another one follows that has room, which is the present
    /// one from now on. Throws std::bad_alloc.
    bool goOn(unsigned int cause);
    /// The call is over.
    void leave() { m_place.reset(); }

private:
    bool take(std::size_t first);

    Routing::Choices m_routes;
    std::string m_number; // without the route's own change
    bool m_isRewritten = false;
    std::size_t m_present = 0;
    QCause m_refusal = QCause::NO_ROUTE_TO_DESTINATION;
    std::shared_ptr<RouteLoad::Place> m_place; // null: the present route has no limit
};
