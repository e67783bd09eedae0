#include "operation/metric/GatewayMetrics.h"

#include "callcontrol/CC_CallPool.h"
#include "callcontrol/version.h"
#include "host/Capture.h"
#include "host/SignallingLoop.h"
#include "operation/Log.h"
#include "operation/metric/ProcessMetrics.h"
#include "operation/record/CallRecords.h"
#include "operation/record/CallWatch.h"

namespace
{
constexpr double POOL_MILLISECONDS = 1e3; // in a second
} // namespace

GatewayMetrics::GatewayMetrics(GatewayHost const& host, SignallingModules const& modules,
                               std::map<std::string, std::string> const& interfaces, CallWatch const& watch,
                               CallMetrics const& calls, CallRecords const* records, TYEventLoop& loop)
    : m_host(host)
    , m_modules(modules)
    , m_interfaces(interfaces)
    , m_watch(watch)
    , m_calls(calls)
    , m_records(records)
    , m_lag(loop)
{
    m_host.loop.setTurnTime(&m_turns);
}

GatewayMetrics::~GatewayMetrics() { m_host.loop.setTurnTime(nullptr); }

std::string GatewayMetrics::getText() const
{
    MetricText text;
    addState(text);
    addCounters(text);
    m_calls.add(text, m_watch);
    addPool(text);
    addRecords(text);
    addCapture(text);
    for (auto const& [name, module] : m_modules)
        module->addMetrics(text);
    ProcessMetrics::ADD(text);
    return text.get();
}

void GatewayMetrics::addState(MetricText& text) const
{
    text.begin("build_info", MetricText::GAUGE, "Always 1; the label says what the process is");
    text.add(1, {{"version", CALLCONTROL_LIBRARY_VERSION_STRING()}});
    text.begin("serving", MetricText::GAUGE, "1 as long as new calls are taken, 0 while the gateway drains or ends");
    text.add(m_host.isEnding || m_host.isDraining ? 0 : 1);
    text.begin("interface_blocked", MetricText::GAUGE, "1 where an operator has taken the interface out of service");
    for (auto const& [name, module] : m_interfaces)
        text.add(m_host.isBlocked(name) ? 1 : 0, {{"interface", name}, {"module", module}});
    text.begin("endpoints", MetricText::GAUGE, "Sides of calls that a module has not done with");
    for (auto const& [name, module] : m_modules)
        text.add(module->getNumberOfEndpoints(), {{"module", name}});
    text.begin("loop_lag_seconds", MetricText::HISTOGRAM, "How late the call-control loop runs what is due");
    text.add(m_lag.getHistogram());
    text.begin("loop_turn_seconds", MetricText::HISTOGRAM, "Processor time of the turns of the signalling loop");
    text.add(m_turns.getHistogram());
    text.begin("log_lines_dropped_total", MetricText::COUNTER, "Lines of the log that nobody took in time");
    text.add(GET_DROPPED_LOG_LINES());
}

void GatewayMetrics::addCounters(MetricText& text) const
{
    Counters const& counters = m_host.counters;
    text.begin("calls_placed_total", MetricText::COUNTER, "Calls that came in and were begun");
    text.add(counters.placed);
    text.begin("calls_answered_total", MetricText::COUNTER, "Calls that were answered");
    text.add(counters.answered);
    text.begin("calls_cleared_total", MetricText::COUNTER, "Calls that were answered and are over");
    text.add(counters.cleared);
    text.begin("calls_failed_total", MetricText::COUNTER, "Calls that are over without an answer, for whatever reason");
    text.add(counters.failed);
    text.begin("calls_refused_total", MetricText::COUNTER, "Calls for which there was no room, or that came too late");
    text.add(counters.refused);
}

void GatewayMetrics::addPool(MetricText& text) const
{
    CC_CallPool::Statistics& pool = CC_CallPool::s_statistics;
    pool.prepareGet();
    text.begin("pool_calls_added_total", MetricText::COUNTER, "Calls of call control that were made");
    text.add(pool.m_callsAdded);
    text.begin("pool_calls_removed_total", MetricText::COUNTER, "Calls of call control that are gone");
    text.add(pool.m_callsRemoved);
    text.begin("pool_call_seconds_total", MetricText::COUNTER, "The number of calls, summed over time");
    text.add(static_cast<double>(pool.m_callTime) / POOL_MILLISECONDS);
    text.begin("pool_most_calls", MetricText::GAUGE, "The most calls that were up at once");
    text.add(pool.m_maxActiveCalls);
}

void GatewayMetrics::addRecords(MetricText& text) const
{
    text.begin("calls_untold_total", MetricText::COUNTER, "Calls of which there is no record, since memory was out");
    text.add(m_watch.getNumberOfLost());
    if (m_records == nullptr)
        return;
    RecordWriter::Counters const records = m_records->getCounters();
    text.begin("records_written_total", MetricText::COUNTER,
               "Records of calls that are where they belong, once for each file and database");
    text.add(records.written);
    text.begin("records_waiting", MetricText::GAUGE, "Records of calls that wait for the disk");
    text.add(records.waiting);
    text.begin("records_spooled", MetricText::GAUGE, "Records of calls that wait on the disk for a database");
    text.add(records.spooled);
    text.begin("records_lost_total", MetricText::COUNTER, "Records of calls for which there was no room");
    text.add(records.lost);
}

void GatewayMetrics::addCapture(MetricText& text) const
{
    if (m_host.capture == nullptr)
        return;
    Capture::Counters const& counters = m_host.capture->getCounters();
    text.begin("capture_packets_total", MetricText::COUNTER, "Messages and reports that the capture server was sent");
    text.add(counters.sent);
    text.begin("capture_packets_lost_total", MetricText::COUNTER, "Those that could not be sent");
    text.add(counters.lost);
}
