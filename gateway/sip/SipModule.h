#pragma once

#include "configuration/ConfigurationSection.h"
#include "host/CallControlHost.h"
#include "host/SignallingModule.h"
#include "sip/SipConfiguration.h"
#include "sip/endpoint/SipEnvironment.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/stack/SipCapture.h"
#include "sip/stack/SipStack.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

class TYEvent;

/// The signalling module for SIP: its interfaces, on one stack.
class SipModule : public SignallingModule
{
public:
    /// Throws ConfigurationError.
    SipModule(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces);
    ~SipModule() override;

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
    bool prepareChange(Configuration const& configuration,
                       std::vector<ConfigurationSection> const& interfaces) override;
    void change() override;
    void dropChange() override;

private:
    /// An interface as the configuration has it.
    struct Table
    {
        ConfigurationSection section;
        SipConfiguration configuration;
    };
    struct Port
    {
        Port(SipEnvironment& environment, Table const& configured)
            : table(configured)
            , interface(environment, configured.configuration)
            , registration(environment.host.contextName, interface.getName(), interface)
        {
        }
        Table table;
        bool isLeaving = false;
        SipInterface interface;
        CallControlHost::Registration registration; // taken back before the provider ends
    };

    void readTables(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces);
    std::unique_ptr<Port> makePort(Table const& table);
    Port* findPort(std::string const& name) const;
    Table const* findTable(std::string const& name) const;
    void begin(Port& port);
    void end(Port& port);
    void watchEnd(GatewayHost& host);
    void removeIdle();

    template <class Get>
    void addOfEach(MetricText& text, Get const& get) const;
    void addGuarded(MetricText& text) const;
    void addUsers(MetricText& text) const;

    using Ports = std::vector<std::unique_ptr<Port>>;

    std::vector<Table> m_tables; // as they are to be
    SipStack m_stack;
    std::optional<SipEnvironment> m_environment;
    std::optional<SipCapture> m_capture;
    Ports m_ports;
    Ports m_prepared; // for a change
    TYEvent* m_removal = nullptr;
    unsigned int m_leaving = 0; // ports
};
