#pragma once

#include "host/SignallingModule.h"

#include <memory>
#include <string>

struct Configuration;

/// Finds the shared objects of signalling modules in a folder.
///
///     ModuleLoader const loader("/usr/lib/callcontrol-gateway");
///     std::unique_ptr<SignallingModule> sip = loader.load("sip", configuration);
class ModuleLoader
{
public:
    explicit ModuleLoader(std::string folder) : m_folder(std::move(folder)) {}

    /// The module of that name with its tables of the configuration read. Throws ConfigurationError for one that is not
    /// there, is none of this gateway's version, or finds fault with its tables.
    std::unique_ptr<SignallingModule> load(std::string const& name, Configuration const& configuration) const;

    /// Beside the executable that runs, where an installation has the modules.
    static std::string GET_INSTALLED_FOLDER();

private:
    std::string m_folder;
};
