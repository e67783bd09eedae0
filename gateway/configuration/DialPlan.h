#pragma once

#include <string>
#include <string_view>

class ConfigurationSection;

/// How numbers are dialled where the gateway stands: what comes in with one of its prefixes becomes an international
/// number, "+" and digits, so that routes need one form alone. A plain value.
///
///     DialPlan const plan{"00", "0", "49"};
///     plan.normalise("0044201"); // "+44201"
///     plan.normalise("089123");  // "+4989123"
///     plan.normalise("4711");    // "4711"
struct DialPlan
{
    std::string international; ///< before a country's code; empty: none
    std::string national;      ///< before a number of the own country; empty: none
    std::string country;       ///< the own code; empty: national numbers stay as they are

    /// Of [gateway]. Throws ConfigurationError.
    static DialPlan READ(ConfigurationSection const& section);
    bool isEmpty() const { return international.empty() && national.empty(); }
    /// Throws std::bad_alloc.
    std::string normalise(std::string_view number) const;
    /// Whether another digit could make it a prefix, or the longer one of two.
    bool isBeginning(std::string_view number) const;
};
