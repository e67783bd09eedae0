// A log line that nobody wants: what the hundreds of them in a call cost.
#include "CallScenario.h"
#include "calls/CC_Monitor.h"

#include <benchmark/benchmark.h>
#include <spdlog/logger.h>
#include <spdlog/sinks/null_sink.h>

namespace
{
struct Nothing
{
    void log(String const&, unsigned int&) {}
};

struct CallControlMonitor
{
    void log(String const& name, unsigned int& lines)
    {
        if (RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_FLOW))
            monitor->debug("[Call %s] line %u", name.c_str(), ++lines);
    }
};

struct Spdlog
{
    Spdlog() { m_logger.set_level(spdlog::level::off); }
    void log(String const& name, unsigned int& lines)
    {
        if (m_logger.should_log(spdlog::level::info)) // as its macros do: arguments are not evaluated in vain
            m_logger.info("[Call {}] line {}", name.c_str(), ++lines);
    }
    spdlog::logger m_logger{"calls", std::make_shared<spdlog::sinks::null_sink_mt>()};
};

template <class Logger>
void DISABLED_LINE(benchmark::State& state)
{
    RTD::REPOSITORY::ENABLE(CC_Monitor::ID, RTD::LEVEL_FAILURE);
    Logger logger;
    String const name = "0x55d0c0ffee00";
    unsigned int lines = 0;
    for (auto _ : state)
    {
        logger.log(name, lines);
        benchmark::ClobberMemory();
    }
    RTD::REPOSITORY::ENABLE(CC_Monitor::ID, RTD::LEVEL_OFF);
    MUST(lines == 0, "logging nothing");
}

BENCHMARK(DISABLED_LINE<Nothing>)->Name("Log/nothing");
BENCHMARK(DISABLED_LINE<CallControlMonitor>)->Name("Log/Monitor");
BENCHMARK(DISABLED_LINE<Spdlog>)->Name("Log/spdlog");
} // namespace
