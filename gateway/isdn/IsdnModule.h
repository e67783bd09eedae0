#pragma once

#include "host/CallControlHost.h"
#include "host/SignallingModule.h"
#include "isdn/IsdnConfiguration.h"
#include "isdn/endpoint/IsdnInterface.h"
#include "isdn/line/IsdnSocketLine.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// The signalling module for ISDN: its primary-rate lines. Its descriptors and timers run in whatever loop is the
/// outermost.
class IsdnModule : public SignallingModule
{
public:
    /// Throws ConfigurationError.
    IsdnModule(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces);

    // --- SignallingModule
    void open(GatewayHost& host) override;
    unsigned int clearCalls(QCause cause) override;
    std::size_t getNumberOfEndpoints() const override;
    std::string describe() const override;
    bool clearCall(unsigned long long serial, QCause cause) override;
    void addMetrics(MetricText& text) const override;
    std::vector<StateRow> getPeers() const override;

private:
    struct Port
    {
        Port(IsdnEnvironment& environment, IsdnConfiguration const& configuration)
            : line(configuration.line)
            , interface(environment, configuration, line)
            , registration(environment.contextName, interface.getName(), interface)
        {
        }
        IsdnSocketLine line;
        IsdnInterface interface;
        CallControlHost::Registration registration; // taken back before the provider ends
    };

    std::vector<IsdnConfiguration> m_configurations;
    std::optional<IsdnEnvironment> m_environment;
    std::vector<std::unique_ptr<Port>> m_ports;
};
