#include "tests/simulation/Ladder.h"

#include <utility>

#ifndef SIMULATION_OLD_LIBRARY
#include "diagnosis/CC_RecordingReport.h"
#include "recorder/CC_Recorder.h"

#include <tuple>
#include <unistd.h>
#endif

namespace Simulation
{
#ifdef SIMULATION_OLD_LIBRARY
Ladder::Ladder(std::string path) : m_path(std::move(path)) {}
Ladder::~Ladder() {}
std::string Ladder::getText() const { return {}; }
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
#endif
} // namespace Simulation
