#pragma once

#include "configuration/ConfigurationSection.h"
#include "configuration/WeekHours.h"

#include <set>
#include <string>
#include <vector>

/// Where calls to some numbers leave: those that come in on `from` to a number that begins with `prefix`. A plain
/// value.
struct Route
{
    static constexpr unsigned int MOST_WEIGHT = 1000;

    std::string from;
    std::string prefix;
    std::string to;
    bool isWhole = false;               ///< `prefix` is all of the number
    std::string calling{};              ///< the caller's number begins so
    WeekHours hours{};                  ///< only then
    unsigned int weight = 0;            ///< its share among routes for the same; 0: only after the others
    unsigned int strip = 0;             ///< so many characters are taken off the number's front,
    std::string prepend{};              ///< and these are put there
    std::vector<unsigned int> nextOn{}; ///< causes (Q.850) upon which the next route is tried
    std::string user{};                 ///< only for whom the interface knows by this name
    unsigned int maxCalls = 0;          ///< at the same time; 0: no limit. Beyond a limit the next route is tried
    unsigned int maxCallsPerSecond = 0; ///< 0: no limit
    bool isEmergency = false;           ///< nothing refuses a call by it

    /// [[route]], between interfaces of these names. Throws ConfigurationError.
    static Route READ(ConfigurationSection const& section, std::set<std::string> const& interfaces);
    /// The number as it leaves.
    std::string shape(std::string_view number) const;
    bool isLimited() const { return maxCalls != 0 || maxCallsPerSecond != 0; }
    bool isShaping() const { return strip > 0 || !prepend.empty(); }
    /// Whether the next one is tried when a call ended with that cause before anybody was reached.
    bool goesOnAfter(unsigned int cause) const;
};
