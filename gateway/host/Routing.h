#pragma once

#include "configuration/Configuration.h"

#include <string>
#include <string_view>
#include <vector>

/// Says on which interface a call leaves: of the routes of its interface, the one with the longest prefix of the called
/// number; among equals the first. Immutable; any thread.
///
///     std::string const* const to = routing.find("a", "4989123"); // null: no route
class Routing
{
public:
    explicit Routing(std::vector<Configuration::Route> routes) : m_routes(std::move(routes)) {}

    /// The name of the outgoing interface, which lives as long as the table; null when no route fits.
    std::string const* find(std::string_view from, std::string_view number) const;

private:
    std::vector<Configuration::Route> m_routes;
};
