#pragma once

#include "platform/monitor/Monitor.h"

#include <string>

/// Sends the lines of the library's monitors to spdlog: failures as warnings, all others as information.
class MonitorWriter : public RTD::Writer
{
public:
    void write(unsigned int monitorId, unsigned int level, char const* text) override;
};

/// Sets up spdlog on a file, or on the standard error stream for an empty name. A line never holds up its writer.
/// `level`: a name of spdlog's ("info"). False when the file cannot be opened.
bool SET_UP_LOG(std::string const& level, std::string const& file = {});
/// How much is told from now on: a level of spdlog's by its name, and one of the library's monitor of call control.
void SET_LOG_LEVELS(std::string const& level, unsigned int callControl);
/// Goes on in a file of that name, after the one before was moved away. False when it cannot be opened: the old one is
/// gone on with.
bool REOPEN_LOG();
/// Lines that nobody took in time.
unsigned long long GET_DROPPED_LOG_LINES();
