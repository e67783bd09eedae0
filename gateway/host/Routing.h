#pragma once

#include "configuration/Route.h"
#include "host/RouteLoad.h"

#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

/// Says on which interface a call leaves: of the routes of its interface that fit, one for the whole number before one
/// for its beginning, and the longest beginning first; among those for the same by their weights. What it costs depends
/// on the number's length, not on how many routes there are. Immutable; any thread.
///
///     Routing::Choices const routes = routing.find({.from = "a", .number = "4989123"});
///     if (!routes.empty())
///         ... // leaves on routes.front()->to
class Routing
{
public:
    /// What is known of a call that is to leave.
    struct Question
    {
        std::string_view from;
        std::string_view number;
        std::string_view calling{};
        unsigned int minuteOfWeek = 0; ///< from Monday 00:00 on
        unsigned int chance = 0;       ///< any number: calls with other ones are spread by the routes' weights
        std::string_view user{};       ///< of the caller, as whom the interface knows him
    };
    /// A route, and its calls where these are limited.
    struct Entry : Route
    {
        std::shared_ptr<RouteLoad> load; ///< null: there is no limit
    };
    /// The one that is taken first, and those that may be tried after it; none: no route fits.
    using Choices = std::vector<std::shared_ptr<Entry const>>;

    /// The calls of routes that `before` has as well go on counting.
    explicit Routing(std::vector<Route> const& routes, Routing const* before = nullptr);
    Routing(Routing&&) = default; // never copied: m_keys are of m_routes
    Routing& operator=(Routing&&) = default;

    Choices find(Question const& question) const;
    /// Whether more digits could give the number a route.
    bool isBeginning(std::string_view from, std::string_view number) const;
    /// Whether a call to the number, as it was dialled, must be refused for nothing: a route says so that is the whole
    /// number, or its longest prefix that any route has.
    bool isEmergency(std::string_view from, std::string_view number) const;
    bool hasEmergency() const { return m_hasEmergency; }
    /// Every route for the number, in the order in which they are looked at: a line each that says what becomes of it.
    std::vector<std::string> explain(Question const& question) const;

private:
    struct Hash : std::hash<std::string_view>
    {
        using is_transparent = void;
    };

    std::shared_ptr<RouteLoad> findLoad(std::string const& key, Route const& route) const;
    /// Tells `take` of the routes for the whole number, then of those for each beginning of it, the longest first.
    template <class Take>
    void forEach(Question const& question, Take&& take) const;

    std::unordered_map<std::string, Choices, Hash, std::equal_to<>> m_routes; // by KEY_OF
    std::vector<std::size_t> m_lengths;                                       // of prefixes, the longest first
    std::vector<std::string_view> m_keys;                                     // of m_routes, in their order
    bool m_hasEmergency = false;
};
