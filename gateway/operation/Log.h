#pragma once

#include "platform/monitor/Monitor.h"

#include <string>

/// Sends the lines of the library's monitors to spdlog: failures as warnings, all others as information.
class MonitorWriter : public RTD::Writer
{
public:
    void write(unsigned int monitorId, unsigned int level, char const* text) override;
};

/// Sets up spdlog on the standard error stream. `level`: a name of spdlog's ("info").
void SET_UP_LOG(std::string const& level);
