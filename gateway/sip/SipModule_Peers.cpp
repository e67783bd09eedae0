// Whom the module for SIP talks to, for operators.
#include "sip/SipModule.h"

#include <spdlog/fmt/fmt.h>

#include <algorithm>

namespace
{
StateRow CONTACT(std::string_view interface, std::string const& user, SipBinding const& binding)
{
    return {{"interface", std::string(interface)},
            {"side", "here"},
            {"user", user},
            {"contact", binding.uri},
            {"seconds", std::to_string(std::max(0LL, binding.until - SipBindings::NOW()))}};
}

StateRow OWN(SipConfiguration const& configuration, SipRegistration const& registration)
{
    return {{"interface", configuration.name},
            {"side", "peer"},
            {"user", configuration.user},
            {"contact", registration.isBound() ? configuration.peer.text() : "(not registered)"},
            {"seconds", std::to_string(registration.getSecondsLeft())}};
}
} // namespace

std::vector<StateRow> SipModule::getPeers() const
{
    std::vector<StateRow> rows;
    for (auto const& port : m_ports)
    {
        SipConfiguration const& configuration = port->interface.getConfiguration();
        SipPeers const& peers = port->interface.getPeers();
        for (std::size_t i = 0; i < peers.getNumberOfPeers(); ++i)
            rows.push_back({{"interface", configuration.name},
                            {"peer", peers.getAddress(i).text()},
                            {"state", peers.getStateName(i)}});
        if (peers.getNumberOfPeers() == 0)
            rows.push_back({{"interface", configuration.name}, {"peer", "(who registers)"}, {"state", "up"}});
    }
    return rows;
}

std::vector<StateRow> SipModule::getRegistrations() const
{
    std::vector<StateRow> rows;
    for (auto const& port : m_ports)
    {
        SipConfiguration const& configuration = port->interface.getConfiguration();
        if (SipRegistration const* const registration = port->interface.getRegistration())
            rows.push_back(OWN(configuration, *registration));
        if (SipRegistrar const* const registrar = port->interface.getRegistrar())
            registrar->visit([&](std::string const& user, SipBinding const& binding)
                             { rows.push_back(CONTACT(configuration.name, user, binding)); });
    }
    return rows;
}
