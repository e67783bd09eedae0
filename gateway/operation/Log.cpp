#include "operation/Log.h"

#include "operation/Output.h"

#include <spdlog/sinks/base_sink.h>
#include <spdlog/spdlog.h>

#include <memory>
#include <mutex>
#include <unistd.h>

namespace
{
constexpr unsigned int CALL_CONTROL_MONITOR = 41;

std::string s_file; // empty: the standard error stream

Output& LOG_OUTPUT()
{
    static Output s_output(STDERR_FILENO);
    return s_output;
}

/// Sends what the logger writes to the output.
class OutputSink : public spdlog::sinks::base_sink<std::mutex>
{
public:
    OutputSink() { set_pattern("%Y-%m-%dT%H:%M:%S.%e%z %l %v"); }

private:
    void sink_it_(spdlog::details::log_msg const& message) override
    {
        spdlog::memory_buf_t text;
        formatter_->format(message, text);
        LOG_OUTPUT().write({text.data(), text.size()});
    }
    void flush_() override {}
};
} // namespace

void MonitorWriter::write(unsigned int monitorId, unsigned int level, char const* text)
{
    spdlog::log(level == RTD::LEVEL_FAILURE ? spdlog::level::warn : spdlog::level::info, "[{}/{}] {}", monitorId, level,
                text);
}

bool SET_UP_LOG(std::string const& level, std::string const& file)
{
    s_file = file;
    auto const logger = std::make_shared<spdlog::logger>("gateway", std::make_shared<OutputSink>());
    logger->set_level(spdlog::level::from_str(level));
    spdlog::set_default_logger(logger);
    return s_file.empty() || REOPEN_LOG();
}

void SET_LOG_LEVELS(std::string const& level, unsigned int callControl)
{
    spdlog::set_level(spdlog::level::from_str(level));
    RTD::REPOSITORY::ENABLE(CALL_CONTROL_MONITOR, callControl);
}

bool REOPEN_LOG() { return s_file.empty() || LOG_OUTPUT().open(s_file.c_str()); }

unsigned long long GET_DROPPED_LOG_LINES() { return LOG_OUTPUT().getDropped(); }
