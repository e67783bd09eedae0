#pragma once

#include "host/GatewayHost.h"
#include "host/SignallingModule.h"
#include "host/TurnTime.h"
#include "operation/metric/CallMetrics.h"
#include "operation/metric/LoopLag.h"

#include <map>
#include <string>

class CallRecords;
class CallWatch;

/// All figures of the gateway, gathered when somebody wants them. On the signalling thread.
///
///     watch.tell([&](CallRecord const& record) { calls.note(record); });
///     GatewayMetrics metrics(host, modules, moduleOf, watch, calls, records, callControlLoop);
class GatewayMetrics
{
public:
    /// All are the gateway's and outlive this. `interfaces`: the module of each. `records`: null where none are
    /// written. `loop`: the one that is watched.
    GatewayMetrics(GatewayHost const& host, SignallingModules const& modules,
                   std::map<std::string, std::string> const& interfaces, CallWatch const& watch,
                   CallMetrics const& calls, CallRecords const* records, TYEventLoop& loop);

    ~GatewayMetrics();
    GatewayMetrics(GatewayMetrics const&) = delete;
    GatewayMetrics& operator=(GatewayMetrics const&) = delete;

    /// Throws std::bad_alloc.
    std::string getText() const;

private:
    void addState(MetricText& text) const;
    void addCounters(MetricText& text) const;
    void addPool(MetricText& text) const;
    void addRecords(MetricText& text) const;
    void addCapture(MetricText& text) const;

    GatewayHost const& m_host;
    SignallingModules const& m_modules;
    std::map<std::string, std::string> const& m_interfaces;
    CallWatch const& m_watch;
    CallMetrics const& m_calls;
    CallRecords const* m_records;
    LoopLag m_lag;
    TurnTime m_turns;
};
