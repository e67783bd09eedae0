#include "tests/simulation/Ladder.h"

#include <utility>

#ifndef SIMULATION_OLD_LIBRARY
#include "diagnosis/CC_RecordingReport.h"
#include "recorder/CC_RecordFormat.h"
#include "recorder/CC_Recorder.h"
#include "tests/simulation/Run.h"

#include <cstring>
#include <tuple>
#include <unistd.h>
#endif

namespace Simulation
{
#ifdef SIMULATION_OLD_LIBRARY
Ladder::Ladder(std::string path) : m_path(std::move(path)) {}
Ladder::~Ladder() {}
std::string Ladder::getText() const { return {}; }
std::string RECORDS_OF(Operations const&) { return {}; }
#else
Ladder::Ladder(std::string path) : m_path(std::move(path)) { std::ignore = CC_Recorder::OPEN(m_path.c_str()); }

Ladder::~Ladder()
{
    CC_Recorder::CLOSE();
    unlink(m_path.c_str());
}

std::string Ladder::getText() const
{
    CC_RecordingReport const report(CC_Recording::READ(CC_Recorder::GET_IMAGE()), CC_RecordingReport::Privacy::WHOLE);
    std::string text;
    for (std::string const& line : report.getLadders())
        (text += line) += '\n';
    return text;
}

std::string RECORDS_OF(Operations const& operations)
{
    std::ignore = CC_Recorder::START();
    Outcome const outcome = RUN(operations);
    CC_RecordFormat::Header header{};
    std::uint64_t sum = 0xcbf29ce484222325; // FNV-1a
    if (auto const image = CC_Recorder::GET_IMAGE(); !image.empty())
    {
        std::memcpy(&header, image.data(), sizeof header);
        for (std::byte const octet : image.subspan(sizeof header))
            sum = (sum ^ static_cast<std::uint64_t>(octet)) * 0x100000001b3;
    }
    CC_Recorder::CLOSE();
    return std::to_string(header.head) + " octets, " + std::to_string(sum) + (outcome.hasFailed() ? ", failed" : "");
}
#endif
} // namespace Simulation
