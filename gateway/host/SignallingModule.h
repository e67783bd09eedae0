#pragma once

#include "platform/signalling/QCause.h"

#include <cstddef>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

class ConfigurationSection;
class MetricText;
class SignallingLoop;
struct Configuration;
struct GatewayHost;

/// A line of a list: names, and the text of each.
using StateRow = std::vector<std::pair<std::string_view, std::string>>;

/// A signalling module of the gateway: the interfaces of one protocol. It lies in a shared object of its own,
/// callcontrol-gateway-NAME.so, which is loaded when the configuration has [[NAME]], and is never unloaded. Modules do
/// not know each other: between them there is call control and nothing else.
///
/// A module registers a provider of call control for each of its interfaces, under the interface's name, and from then
/// on dials for the calls that come in and takes those that are offered (docs/writing-a-module.md). Owned by the
/// gateway, on its signalling thread.
///
///     class EchoModule : public SignallingModule { ... };
///     CALLCONTROL_GATEWAY_MODULE(EchoModule) // once, in one source; needs EchoModule(Configuration, interfaces)
class SignallingModule
{
public:
    /// Changes whenever a module that was built before would not run any more.
    static constexpr unsigned int VERSION = 4;

    /// Ends what is still up without a word to the peers.
    virtual ~SignallingModule() = default;

    /// The loop of the module's stack where it has to be the outermost; it must be there before `open`. At most one
    /// module may have one.
    virtual SignallingLoop* getLoop() { return nullptr; }
    /// Opens the interfaces; the host outlives the module. Throws ConfigurationError for an interface that cannot be
    /// served.
    virtual void open(GatewayHost& host) = 0;
    /// Clears every call towards its peer with the cause. Milliseconds that the peers may take to say that they heard.
    virtual unsigned int clearCalls(QCause cause) = 0;
    /// Endpoints that are not over yet, on the wire or in call control.
    virtual std::size_t getNumberOfEndpoints() const = 0;
    /// Lines for the gateway's dump, each with its line break.
    virtual std::string describe() const = 0;
    /// Clears what it has in the call of that serial number with the cause; false: nothing.
    virtual bool clearCall(unsigned long long serial, QCause cause) = 0;
    /// Families of its own for the gateway's figures, under names that begin with its own. Throws std::bad_alloc.
    virtual void addMetrics(MetricText&) const {}
    /// For operators: whom its interfaces talk to, and who is registered, here or elsewhere. All rows of a list have
    /// the same names. Registrations may be many: a copy of the process tells them. @{
    virtual std::vector<StateRow> getPeers() const { return {}; }
    virtual std::vector<StateRow> getRegistrations() const { return {}; }
    /// @}

    /// A changed configuration is followed in two steps, so that nothing of it is if anything cannot be. The first one
    /// checks the tables of the module's interfaces and opens those that are new, but takes no calls there yet; false:
    /// the module can follow no change. Throws ConfigurationError for one that it cannot follow.
    virtual bool prepareChange(Configuration const&, std::vector<ConfigurationSection> const&) { return false; }
    /// Then this follows: from now on the interfaces are those. One that is not among them takes no new call, and goes
    /// with its last one, which the host is told (GatewayHost::leaving).
    virtual void change() {}
    /// Or this: all stays as it was.
    virtual void dropChange() {}
};

using SignallingModules = std::map<std::string, std::unique_ptr<SignallingModule>>; ///< by name

/// The entry of a module's shared object: its version, and a function that makes it of the configuration and the tables
/// of its name, one an interface. That reads and checks them, throws ConfigurationError for what is wrong, and opens
/// nothing yet. @{
#define CALLCONTROL_GATEWAY_MODULE(Module)                                                                             \
    extern "C" __attribute__((visibility("default"))) unsigned int const callcontrol_gateway_module_version =          \
        SignallingModule::VERSION;                                                                                     \
    extern "C" __attribute__((visibility("default"))) SignallingModule* callcontrol_gateway_module(                    \
        Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces)                       \
    {                                                                                                                  \
        return std::make_unique<Module>(configuration, interfaces).release();                                          \
    }
using MakeSignallingModule = SignallingModule*(Configuration const&, std::vector<ConfigurationSection> const&);
/// @}
