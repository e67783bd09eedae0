#pragma once

#include "operation/record/CallRecord.h"

#include <array>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <spdlog/spdlog.h>
#include <string>
#include <thread>
#include <vector>

/// A folder of its own, and a silent log.
class RecordsFixture : public testing::Test
{
protected:
    RecordsFixture()
    {
        spdlog::set_level(spdlog::level::off);
        std::array<char, 64> name{"/tmp/record-test.XXXXXX"};
        folder = mkdtemp(name.data());
    }
    ~RecordsFixture() override { std::filesystem::remove_all(folder); }

    static CallRecord RECORD(unsigned long long serial)
    {
        CallRecord record;
        record.serial = serial;
        record.start = 1795345935204000000;
        record.ended = 1.5;
        return record;
    }
    static std::vector<std::string> LINES_OF(std::string const& file)
    {
        std::vector<std::string> lines;
        std::ifstream stream(file);
        for (std::string line; std::getline(stream, line);)
            lines.push_back(line);
        return lines;
    }
    /// The calls of a file's records, " (interrupted)" with those that were.
    static std::vector<std::string> CALLS_OF(std::string const& file)
    {
        std::vector<std::string> calls;
        for (std::string const& line : LINES_OF(file))
        {
            std::string const call = line.substr(line.find("\"call\":") + 7);
            bool const isInterrupted = line.find("\"endedAfter\":null,\"interrupted\":true") != std::string::npos;
            calls.push_back(call.substr(0, call.find(',')) + (isInterrupted ? " (interrupted)" : ""));
        }
        return calls;
    }
    template <class Is>
    static bool WAIT_UNTIL(Is const& is)
    {
        for (int i = 0; i < 6000 && !is(); ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        return is();
    }

    using Calls = std::vector<std::string>;
    std::string folder;
};
