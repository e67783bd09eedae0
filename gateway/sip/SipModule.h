#pragma once

#include "host/CallControlHost.h"
#include "host/SignallingModule.h"
#include "sip/SipConfiguration.h"
#include "sip/endpoint/SipEnvironment.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/stack/SipStack.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// The signalling module for SIP: its interfaces, on one stack.
class SipModule : public SignallingModule
{
public:
    /// Throws ConfigurationError.
    SipModule(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces);

    // --- SignallingModule
    SignallingLoop* getLoop() override { return &m_stack; }
    void open(GatewayHost& host) override;
    unsigned int clearCalls(QCause cause) override;
    std::size_t getNumberOfEndpoints() const override;
    std::string describe() const override;
    bool clearCall(unsigned long long serial, QCause cause) override;
    void addMetrics(MetricText& text) const override;
    std::vector<StateRow> getPeers() const override;
    std::vector<StateRow> getRegistrations() const override;

private:
    struct Port
    {
        Port(SipEnvironment& environment, SipConfiguration const& configuration)
            : interface(environment, configuration)
            , registration(environment.host.contextName, interface.getName(), interface)
        {
        }
        SipInterface interface;
        CallControlHost::Registration registration; // taken back before the provider ends
    };

    template <class Get>
    void addOfEach(MetricText& text, Get const& get) const;
    void addGuarded(MetricText& text) const;
    void addUsers(MetricText& text) const;

    std::string m_file; // of the configuration
    std::vector<SipConfiguration> m_configurations;
    SipStack m_stack;
    std::optional<SipEnvironment> m_environment;
    std::vector<std::unique_ptr<Port>> m_ports;
};
