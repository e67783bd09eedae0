#include "configuration/Route.h"

#include <algorithm>
#include <limits>
#include <stdexcept>
#include <string_view>

namespace
{
constexpr unsigned int HIGHEST_CAUSE = 127; // Q.850
constexpr unsigned int HIGHEST_LIMIT = std::numeric_limits<int>::max();

std::string READ_INTERFACE(ConfigurationSection const& section, char const* key,
                           std::set<std::string> const& interfaces)
{
    std::string name = section.neededText(key);
    if (!interfaces.contains(name))
        section.refuse(key, "there is no interface '" + name + "'");
    return name;
}

/// An emergency number is everybody's.
void READ_LIMITS(ConfigurationSection const& section, Route& route)
{
    route.maxCalls = section.number("max-calls", 0, 0, HIGHEST_LIMIT);
    route.maxCallsPerSecond = section.number("max-calls-per-second", 0, 0, HIGHEST_LIMIT);
    route.isEmergency = section.flag("emergency");
    if (!route.isEmergency)
        return;
    if (route.prefix.empty())
        section.refuse("emergency", "for which number? number or prefix is needed");
    if (route.isLimited())
        section.refuse("emergency", "and a limit of calls exclude each other");
    if (section.has("user"))
        section.refuse("emergency", "and user exclude each other");
}

WeekHours READ_HOURS(ConfigurationSection const& section)
{
    try
    {
        return WeekHours::PARSE(section.texts("days", {}), section.text("hours", {}));
    }
    catch (std::invalid_argument const& error)
    {
        section.refuse(section.has("hours") ? "hours" : "days", error.what());
    }
}
} // namespace

Route Route::READ(ConfigurationSection const& section, std::set<std::string> const& interfaces)
{
    section.allow({"from", "prefix", "number", "calling", "days", "hours", "weight", "to", "strip", "prepend",
                   "next-on", "user", "max-calls", "max-calls-per-second", "emergency"});
    Route route{READ_INTERFACE(section, "from", interfaces), section.text("prefix", {}),
                READ_INTERFACE(section, "to", interfaces)};
    if (section.has("number"))
    {
        if (section.has("prefix"))
            section.refuse("number", "and prefix exclude each other");
        route.isWhole = true;
        route.prefix = section.neededText("number");
    }
    route.calling = section.text("calling", {});
    route.hours = READ_HOURS(section);
    route.weight = section.number("weight", 0, 0, MOST_WEIGHT);
    route.strip = section.number("strip", 0, 0, static_cast<unsigned int>(route.prefix.size()));
    route.prepend = section.text("prepend", {});
    route.nextOn = section.numbers("next-on", 1, HIGHEST_CAUSE);
    route.user = section.text("user", {});
    READ_LIMITS(section, route);
    return route;
}

std::string Route::shape(std::string_view number) const
{
    return prepend + std::string(number.substr(std::min<std::size_t>(strip, number.size())));
}

bool Route::goesOnAfter(unsigned int cause) const
{
    return std::find(nextOn.begin(), nextOn.end(), cause) != nextOn.end();
}
