#pragma once

#include "host/GatewayHost.h"
#include "host/SignallingModule.h"
#include "operation/CallTracer.h"
#include "operation/control/ControlServer.h"
#include "operation/record/CallRecords.h"
#include "operation/record/CallWatch.h"

#include <map>
#include <optional>
#include <string>
#include <string_view>

/// What operators may have the gateway do as a whole.
class ControlledGateway
{
public:
    virtual ~ControlledGateway() = default;
    /// No new calls; those that are up may go on for that time, or the configured one. The second time it clears them
    /// at once.
    virtual void shutDown(std::optional<unsigned int> seconds) = 0;
    /// Follows a changed configuration. Empty, or the reason why all stays as it was.
    virtual std::string reload() = 0;
};

/// The commands of an operator's socket: docs/operation.md tells what each answers.
class ControlCommands : public ControlHandler
{
public:
    /// All are the gateway's and outlive this. `interfaces`: the module of each. `records`: null
    /// where none are written.
    ControlCommands(GatewayHost& host, SignallingModules const& modules,
                    std::map<std::string, std::string> const& interfaces, CallWatch& watch, CallTracer& tracer,
                    CallRecords const* records, ControlledGateway& gateway)
        : m_host(host)
        , m_modules(modules)
        , m_interfaces(interfaces)
        , m_watch(watch)
        , m_tracer(tracer)
        , m_records(records)
        , m_gateway(gateway)
    {
    }

    // --- ControlHandler
    bool isLong(ControlRequest const& request) const override;
    ControlAnswer answer(ControlRequest const& request, std::string const& user) override;

private:
    struct Command;
    static Command const* FIND(std::string_view verb);

    ControlAnswer help(ControlRequest const& request);
    ControlAnswer status(ControlRequest const& request);
    ControlAnswer interfaces(ControlRequest const& request);
    ControlAnswer stats(ControlRequest const& request);
    ControlAnswer drop(ControlRequest const& request);
    ControlAnswer block(ControlRequest const& request);
    ControlAnswer unblock(ControlRequest const& request);
    ControlAnswer drain(ControlRequest const& request);
    ControlAnswer resume(ControlRequest const& request);
    ControlAnswer reload(ControlRequest const& request);
    ControlAnswer shutDown(ControlRequest const& request);
    // ControlCommands_Calls.cpp
    ControlAnswer calls(ControlRequest const& request);
    ControlAnswer call(ControlRequest const& request);
    ControlAnswer history(ControlRequest const& request);
    ControlAnswer recorded(ControlRequest const& request);
    // ControlCommands_Top.cpp
    ControlAnswer top(ControlRequest const& request);
    // ControlCommands_Trace.cpp
    ControlAnswer peers(ControlRequest const& request);
    ControlAnswer registrations(ControlRequest const& request);
    ControlAnswer trace(ControlRequest const& request);

    char const* getPhase() const;

    GatewayHost& m_host;
    SignallingModules const& m_modules;
    std::map<std::string, std::string> const& m_interfaces;
    CallWatch& m_watch;
    CallTracer& m_tracer;
    CallRecords const* m_records;
    ControlledGateway& m_gateway;
    TY::Time m_start = TY::Time::NOW(TY::Time::MONOTONIC);
};
