#pragma once

#include <string>

struct Configuration;

/// What lies between two configurations.
namespace ConfigurationChange
{
/// The first key whose change a running gateway cannot follow; empty: it can follow all. It can those of routes, limits
/// and log levels.
std::string FIND_RESTART(Configuration const& before, Configuration const& after);
} // namespace ConfigurationChange
