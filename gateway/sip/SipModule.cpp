#include "sip/SipModule.h"

#include "callcontrol/CallControl.h"
#include "configuration/Configuration.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_PropertyKind.h"
#include "sip/dialog/SipSessionWord.h"
#include "sip/message/SipCause.h"
#include "sip/message/SipPropertyId.h"
#include "sip/registrar/SipBindingStore.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <stdexcept>
#include <tuple>

namespace
{
std::string DESCRIBE(std::string_view name, SipAuthentication const& authentication)
{
    SipAuthentication::Counters const& counters = authentication.getCounters();
    return fmt::format("interface {}: {} requests of known users, {} asked who, {} wrong, {} stale, {} replayed, {} "
                       "for another URI; {} "
                       "addresses banned, {} requests of theirs ignored\n",
                       name, counters.accepted, counters.asked, counters.wrong, counters.stale, counters.replayed,
                       counters.moved, authentication.getNumberOfBanned(), counters.ignored);
}
} // namespace

SipModule::SipModule(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces)
{
    readTables(configuration, interfaces);
}

SipModule::~SipModule()
{
    if (m_removal == nullptr)
        return;
    m_environment->host.onEndpointGone = nullptr;
    m_removal->destroy();
}

void SipModule::readTables(Configuration const& configuration, std::vector<ConfigurationSection> const& interfaces)
{
    m_tables.clear();
    for (ConfigurationSection const& interface : interfaces)
        m_tables.push_back({interface, SipConfiguration::READ(interface, configuration.relaysMedia)});
}

void SipModule::open(GatewayHost& host)
{
    if (!SipPropertyId::DECLARE().isOk())
        throw std::runtime_error("the names of the SIP properties cannot be declared");
    std::ignore = CC_PropertyKind::DECLARE<SipSessionWord>(); // where there is no room it only takes longer
    m_environment.emplace(SipEnvironment{host, m_stack});
    m_removal = new TYEvent(
        *CallControl::GET_CC_EVENT_LOOP(), EventPrio::LOW,
        [](void* module) { static_cast<SipModule*>(module)->removeIdle(); }, this);
    for (Table const& table : m_tables)
        m_ports.push_back(makePort(table));
    for (auto const& port : m_ports)
        begin(*port);
    host.onEnding.emplace_back(
        [this]
        {
            for (auto const& port : m_ports)
                end(*port);
        });
    host.onReload.emplace_back(
        [this]
        {
            for (auto const& port : m_ports)
                if (SipTls* const tls = port->interface.getTls())
                    tls->reload();
        });
    watchEnd(host);
    if (host.capture != nullptr)
        m_capture.emplace(*host.capture);
}

std::unique_ptr<SipModule::Port> SipModule::makePort(Table const& table)
try
{
    return std::make_unique<Port>(*m_environment, table);
}
catch (SipBindingStore::Failure const& error)
{
    table.section.refuse("registrations", error.what());
}
catch (std::runtime_error const& error)
{
    table.section.refuse("listen", error.what());
}

void SipModule::begin(Port& port)
{
    SipConfiguration const& configuration = port.interface.getConfiguration();
    if (SipRegistration* const registration = port.interface.getRegistration())
        registration->start();
    port.interface.getPeers().startProbing();
    if (m_environment->host.relaysMedia && configuration.security == SipStream::SECURED &&
        !SipWay::IS_SECURED(configuration.way))
        spdlog::warn("interface {}: srtp is required, but its keys go to the peer in the clear: transport is not tls",
                     configuration.name);
    spdlog::info("interface {} listens on {}, its peer is {}", configuration.name, configuration.listen.text(),
                 configuration.hasPeer() ? configuration.peer.text() : "nobody but who registers");
}

void SipModule::end(Port& port)
{
    if (SipRegistration* const registration = port.interface.getRegistration())
        registration->end();
    port.interface.getPeers().endProbing();
}

unsigned int SipModule::clearCalls(QCause cause)
{
    unsigned int patience = 0;
    for (auto const& port : m_ports)
    {
        port->interface.clearCalls({cause, 0, {}});
        patience = std::max(patience, port->interface.getConfiguration().t1x64);
    }
    return patience;
}

bool SipModule::clearCall(unsigned long long serial, QCause cause)
{
    bool isHere = false;
    for (auto const& port : m_ports)
        isHere |= port->interface.clearCall(serial, {cause, 0, {}});
    return isHere;
}

std::size_t SipModule::getNumberOfEndpoints() const
{
    std::size_t number = 0;
    for (auto const& port : m_ports)
        number += port->interface.getNumberOfEndpoints();
    return number;
}

std::string SipModule::describe() const
{
    std::string text;
    for (auto const& port : m_ports)
    {
        if (port->isLeaving)
            text += fmt::format("interface {}: leaving\n", port->interface.getName().view());
        SipGuard const& guard = port->interface.getGuard();
        text +=
            fmt::format("interface {}: {} messages of strangers, {} too large, {} too many, {} connections refused\n",
                        port->interface.getName().view(), guard.getCounters().strangers, guard.getCounters().tooLarge,
                        port->interface.getRequestRate().getNumberOfRefused(), guard.getNumberOfRefused());
        text += port->interface.getPeers().describe();
        if (SipTls const* const tls = port->interface.getTls())
            text += fmt::format("interface {}: {} connections of TLS, {} refused\n", port->interface.getName().view(),
                                tls->getCounters().established, tls->getCounters().refused);
        if (SipCredentials const* const credentials = port->interface.getSender().getCredentials())
            text += fmt::format("interface {}: {} challenges answered, {} credentials not taken\n",
                                port->interface.getName().view(), credentials->getCounters().answered,
                                credentials->getCounters().refused);
        if (SipAuthentication const* const authentication = port->interface.getAuthentication())
            text += DESCRIBE(port->interface.getName().view(), *authentication);
        if (SipRegistrar const* const registrar = port->interface.getRegistrar())
            text += registrar->describe();
        if (SipRegistration const* const registration = port->interface.getRegistration())
            text += registration->describe();
    }
    return text;
}
