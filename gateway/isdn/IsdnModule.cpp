#include "isdn/IsdnModule.h"

#include "callcontrol/CallControl.h"
#include "configuration/Configuration.h"
#include "host/GatewayHost.h"
#include "host/MetricText.h"
#include "isdn/element/IsdnSubaddress.h"

#include <spdlog/spdlog.h>

namespace
{
constexpr unsigned int PATIENCE = 10000; // milliseconds: T305 and T308 (Q.931, 9.2) with what the line takes

unsigned int BEGIN_CALL(GatewayHost& host, std::string const& from)
{
    if (!host.takesCallsFrom(from) || !host.admission.hasRoom(CallControl::GET_NUMBER_OF_CALLS()))
    {
        ++host.counters.refused;
        return 0;
    }
    ++host.counters.placed;
    return ++host.lastCallNumber;
}
} // namespace

IsdnModule::IsdnModule(Configuration const&, std::vector<ConfigurationSection> const& interfaces)
{
    for (ConfigurationSection const& interface : interfaces)
        m_configurations.push_back(IsdnConfiguration::READ(interface));
}

void IsdnModule::open(GatewayHost& host)
{
    m_environment.emplace(IsdnEnvironment{
        host.loop, host.contextName,
        [&host](std::string const& from, std::string const& number, std::string const& calling, unsigned int call)
        { return host.findRoutes(from, number, calling, call); },
        [&host](std::string const& from) { return BEGIN_CALL(host, from); },
        [&host](std::string const& interface) { return host.isBlocked(interface); }, host.dialPlan, host.counters,
        host.relaysMedia,
        [&host]
        {
            if (host.onEndpointGone)
                host.onEndpointGone();
        }});
    if (!IsdnSubaddress::DECLARE().isOk())
        throw std::bad_alloc();
    for (IsdnConfiguration const& configuration : m_configurations)
    {
        m_ports.push_back(std::make_unique<Port>(*m_environment, configuration));
        m_ports.back()->interface.open();
        spdlog::info("interface {} is the {} side of the line {}", configuration.name,
                     configuration.isNetwork ? "network" : "user", configuration.line);
    }
}

unsigned int IsdnModule::clearCalls(QCause cause)
{
    for (auto const& port : m_ports)
        port->interface.clearCalls(cause);
    return PATIENCE;
}

bool IsdnModule::clearCall(unsigned long long serial, QCause cause)
{
    bool isHere = false;
    for (auto const& port : m_ports)
        isHere |= port->interface.clearCall(serial, cause);
    return isHere;
}

/// A line whose far side has not heard all yet counts as one: the ends of its last calls may wait behind the window.
std::size_t IsdnModule::getNumberOfEndpoints() const
{
    std::size_t number = 0;
    for (auto const& port : m_ports)
        number += port->interface.getNumberOfEndpoints() + (port->interface.getLink().isQuiet() ? 0 : 1);
    return number;
}

std::string IsdnModule::describe() const
{
    std::string text;
    for (auto const& port : m_ports)
        text += fmt::format("interface {}: link {}, {} channels free\n", port->interface.getName().view(),
                            port->interface.getLink().isUp() ? "up" : "down",
                            port->interface.getChannels().getNumberOfFree());
    return text;
}

void IsdnModule::addMetrics(MetricText& text) const
{
    text.begin("isdn_link_up", MetricText::GAUGE, "1 where the D channel's link is established");
    for (auto const& port : m_ports)
        text.add(port->interface.getLink().isUp() ? 1 : 0, {{"interface", port->interface.getName().view()}});
    text.begin("isdn_free_channels", MetricText::GAUGE, "B channels that carry no call");
    for (auto const& port : m_ports)
        text.add(port->interface.getChannels().getNumberOfFree(), {{"interface", port->interface.getName().view()}});
}

std::vector<StateRow> IsdnModule::getPeers() const
{
    std::vector<StateRow> rows;
    for (auto const& port : m_ports)
        rows.push_back({{"interface", std::string(port->interface.getName().view())},
                        {"peer", port->interface.getConfiguration().line},
                        {"state", port->interface.getLink().isUp() ? "up" : "down"}});
    return rows;
}
