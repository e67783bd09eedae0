#include "configuration/ConfigurationChange.h"

#include "configuration/Configuration.h"

#include <algorithm>

namespace
{
bool ARE_SAME(std::vector<ConfigurationSection> const& before, std::vector<ConfigurationSection> const& after)
{
    return std::equal(before.begin(), before.end(), after.begin(), after.end(),
                      [](ConfigurationSection const& one, ConfigurationSection const& other)
                      { return one.hasSameValues(other); });
}

/// The first module of `before` that is not in `after`; empty: none.
std::string FIND_MISSING(Configuration const& before, Configuration const& after)
{
    for (auto const& [name, interfaces] : before.modules)
        if (!after.modules.contains(name))
            return name;
    return {};
}
} // namespace

std::string ConfigurationChange::FIND_RESTART(Configuration const& before, Configuration const& after)
{
    if (before.context != after.context)
        return "gateway.context";
    if (before.logFile != after.logFile)
        return "gateway.log-file";
    if (before.recording != after.recording)
        return "gateway.recording";
    if (before.recordingSize != after.recordingSize)
        return "gateway.recording-size";
    if (before.relaysMedia != after.relaysMedia || before.media != after.media)
        return "media";
    if (before.control != after.control)
        return "control";
    if (before.records != after.records)
        return "records";
    if (before.metrics != after.metrics)
        return "metrics";
    if (before.capture != after.capture)
        return "capture";
    std::string const gone = FIND_MISSING(before, after);
    return gone.empty() ? FIND_MISSING(after, before) : gone;
}

bool ConfigurationChange::IS_OF_MODULE(std::string const& module, Configuration const& before,
                                       Configuration const& after)
{
    return !ARE_SAME(before.modules.at(module), after.modules.at(module));
}
