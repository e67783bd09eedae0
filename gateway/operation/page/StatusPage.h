#pragma once

#include "host/GatewayHost.h"
#include "host/SignallingModule.h"

#include <map>
#include <string>

class CallWatch;

/// What the gateway is doing, as a page for a browser: state, counters, interfaces and peers, the calls that have been
/// up for longest. It has nothing to click, runs no script, loads nothing, and is asked for again every five seconds.
/// On the signalling thread.
///
///     StatusPage const page(host, modules, moduleOf, watch);
///     page.getText();
class StatusPage
{
public:
    static constexpr char const* CONTENT_TYPE = "text/html; charset=utf-8";
    static constexpr std::size_t MOST_CALLS = 200;

    /// All are the gateway's and outlive this. `interfaces`: the module of each.
    StatusPage(GatewayHost const& host, SignallingModules const& modules,
               std::map<std::string, std::string> const& interfaces, CallWatch const& watch)
        : m_host(host), m_modules(modules), m_interfaces(interfaces), m_watch(watch)
    {
    }

    /// Throws std::bad_alloc.
    std::string getText() const;

private:
    std::string getState() const;
    std::string getInterfaces() const;
    std::string getPeers() const;
    std::string getCalls() const;

    GatewayHost const& m_host;
    SignallingModules const& m_modules;
    std::map<std::string, std::string> const& m_interfaces;
    CallWatch const& m_watch;
};
