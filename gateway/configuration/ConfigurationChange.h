#pragma once

#include <string>

struct Configuration;

/// What lies between two configurations.
namespace ConfigurationChange
{
/// The first key whose change a running gateway cannot follow; empty: it can follow all. It can those of routes, limits
/// and log levels; those of interfaces are left to their modules.
std::string FIND_RESTART(Configuration const& before, Configuration const& after);
/// Whether the interfaces of a module that both have are others, or have other values.
bool IS_OF_MODULE(std::string const& module, Configuration const& before, Configuration const& after);
} // namespace ConfigurationChange
