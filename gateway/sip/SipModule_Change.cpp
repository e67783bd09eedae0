// How the interfaces follow a changed configuration.
#include "platform/eventloop/TYEvent.h"
#include "sip/SipModule.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <array>
#include <tuple>

namespace
{
/// What may change while calls are up: it is looked at anew for each call, or each time.
constexpr std::array<std::string_view, 12> IN_PLACE{
    "answer-timeout",          "digit-timeout", "failure-tone", "max-call-duration", "max-expires", "min-expires",
    "max-requests-per-source", "min-se",        "ringback",     "session-expires",   "transfer",    "trusted"};
} // namespace

bool SipModule::prepareChange(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces)
{
    readTables(configuration, interfaces); // of no use to anybody if this throws
    for (Table const& table : m_tables)
        if (Port const* const port = findPort(table.configuration.name); port == nullptr)
            m_prepared.push_back(makePort(table));
        else if (std::string const key = port->table.section.findChange(table.section, IN_PLACE); !key.empty())
            table.section.refuse(key, "a change of it needs a restart, or an interface with another name and port");
    return true;
}

void SipModule::dropChange() { m_prepared.clear(); }

void SipModule::change()
{
    for (auto const& port : m_ports)
        if (Table const* const table = findTable(port->interface.getConfiguration().name))
        {
            port->table = *table;
            port->interface.follow(table->configuration);
        }
        else if (!port->isLeaving)
        {
            port->isLeaving = true;
            ++m_leaving;
            end(*port);
            spdlog::info("interface {} is removed, and goes with its last call", port->interface.getName().view());
        }
    for (auto& port : m_prepared)
        begin(*m_ports.emplace_back(std::move(port)));
    m_prepared.clear();
    std::ignore = m_removal->setIfNotPending();
}

/// Not at once: an interface that tells of an end is at work.
void SipModule::watchEnd(GatewayHost& host)
{
    host.onEndpointGone = [this, before = host.onEndpointGone]
    {
        if (before)
            before();
        if (m_leaving != 0)
            std::ignore = m_removal->setIfNotPending();
    };
}

void SipModule::removeIdle()
{
    std::erase_if(m_ports,
                  [this](auto const& port)
                  {
                      if (!port->isLeaving || port->interface.getNumberOfEndpoints() != 0)
                          return false;
                      spdlog::info("interface {} is gone", port->interface.getName().view());
                      --m_leaving;
                      m_environment->host.leaving.erase(port->interface.getConfiguration().name);
                      return true;
                  });
}

SipModule::Port* SipModule::findPort(std::string const& name) const
{
    auto const found = std::find_if(m_ports.begin(), m_ports.end(),
                                    [&](auto const& port) { return port->interface.getConfiguration().name == name; });
    return found != m_ports.end() ? found->get() : nullptr;
}

SipModule::Table const* SipModule::findTable(std::string const& name) const
{
    auto const found = std::find_if(m_tables.begin(), m_tables.end(),
                                    [&](Table const& table) { return table.configuration.name == name; });
    return found != m_tables.end() ? &*found : nullptr;
}
