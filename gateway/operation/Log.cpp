#include "operation/Log.h"

#include <spdlog/sinks/stdout_sinks.h>
#include <spdlog/spdlog.h>

#include <memory>

void MonitorWriter::write(unsigned int monitorId, unsigned int level, char const* text)
{
    spdlog::log(level == RTD::LEVEL_FAILURE ? spdlog::level::warn : spdlog::level::info, "[{}/{}] {}", monitorId, level,
                text);
}

void SET_UP_LOG(std::string const& level)
{
    auto const logger = std::make_shared<spdlog::logger>("gateway", std::make_shared<spdlog::sinks::stderr_sink_st>());
    logger->set_pattern("%H:%M:%S.%e %l %v");
    logger->set_level(spdlog::level::from_str(level));
    logger->flush_on(spdlog::level::trace); // a line that is not out when the process dies is the one that was needed
    spdlog::set_default_logger(logger);
}
