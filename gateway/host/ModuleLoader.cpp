#include "host/ModuleLoader.h"

#include "configuration/Configuration.h"

#include <algorithm>
#include <dlfcn.h>
#include <filesystem>

namespace
{
/// A name and no path.
bool IS_NAME(std::string const& text)
{
    return std::all_of(text.begin(), text.end(),
                       [](char c) { return (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9'); });
}
} // namespace

std::unique_ptr<SignallingModule> ModuleLoader::load(std::string const& name, Configuration const& configuration) const
{
    auto const refuse = [&](std::string const& reason) { throw ConfigurationError(configuration.file, name, reason); };
    if (!IS_NAME(name))
        refuse("is neither a key nor the name of a module");
    std::string const file = m_folder + "/callcontrol-gateway-" + name + ".so";
    if (!std::filesystem::exists(file))
        refuse("is not a key, and there is no module " + file);
    void* const library = dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL | RTLD_NODELETE);
    if (library == nullptr)
        refuse(dlerror());
    auto const* const version = static_cast<unsigned int const*>(dlsym(library, "callcontrol_gateway_module_version"));
    auto* const make = reinterpret_cast<MakeSignallingModule*>(dlsym(library, "callcontrol_gateway_module"));
    if (version == nullptr || make == nullptr)
        refuse(file + " is no module of a gateway");
    if (*version != SignallingModule::VERSION)
        refuse(file + " is a module of version " + std::to_string(*version) + ", this gateway's are of version " +
               std::to_string(SignallingModule::VERSION));
    return std::unique_ptr<SignallingModule>(make(configuration, configuration.modules.at(name)));
}

std::string ModuleLoader::GET_INSTALLED_FOLDER()
{
    return (std::filesystem::read_symlink("/proc/self/exe").parent_path() / CALLCONTROL_GATEWAY_MODULES)
        .lexically_normal();
}
