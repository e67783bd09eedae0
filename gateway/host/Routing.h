#pragma once

#include "configuration/Configuration.h"

#include <functional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

/// Says on which interface a call leaves: of the routes of its interface, the one with the longest prefix of the called
/// number; among equals the first. What it costs depends on the number's length, not on how many routes there are.
/// Immutable; any thread.
///
///     std::string const* const to = routing.find("a", "4989123"); // null: no route
class Routing
{
public:
    /// A route that fits a number.
    struct Match
    {
        std::string_view prefix; ///< of the number that was asked for
        std::string const& to;   ///< the name of the outgoing interface, which lives as long as the table
    };

    explicit Routing(std::vector<Configuration::Route> const& routes);

    /// Null when no route fits.
    std::string const* find(std::string_view from, std::string_view number) const;
    /// Whether more digits could give the number a route.
    bool isBeginning(std::string_view from, std::string_view number) const;
    /// All that fit, the one that is taken first.
    std::vector<Match> findAll(std::string_view from, std::string_view number) const;

private:
    struct Hash : std::hash<std::string_view>
    {
        using is_transparent = void;
    };

    /// Tells `take` of each route that fits, the longest prefix first, until it says that it is enough.
    template <class Take>
    void forEach(std::string_view from, std::string_view number, Take&& take) const;

    std::unordered_map<std::string, std::string, Hash, std::equal_to<>> m_targets; // by KEY_OF(from, prefix)
    std::vector<std::size_t> m_lengths;                                            // of prefixes, the longest first
};
