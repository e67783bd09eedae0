#pragma once

#include "configuration/CaptureOptions.h"
#include "configuration/ConfigurationSection.h"
#include "configuration/ControlOptions.h"
#include "configuration/DialPlan.h"
#include "configuration/MetricOptions.h"
#include "configuration/RecordOptions.h"
#include "configuration/Route.h"
#include "media/context/MediaOptions.h"

#include <map>
#include <set>
#include <string>
#include <string_view>
#include <vector>

/// The gateway's configuration file as read: complete, checked, with defaults filled in, but for the tables of the
/// signalling modules, which these read. A plain value.
///
///     Configuration const configuration = Configuration::READ("/etc/callcontrol-gateway.toml");
///     for (auto const& [name, interfaces] : configuration.modules)
///         ... // a module of that name is needed
///
/// README.md lists the keys.
struct Configuration
{
    std::string file;
    std::string context;                   ///< the call-control context; empty: its default
    std::string logLevel = "info";         ///< of spdlog
    bool isLogLevelFixed = false;          ///< the command line has said it
    std::string logFile;                   ///< empty: the standard error stream
    unsigned int callControlLogLevel = 1;  ///< of the library's monitor, 0 to 5
    unsigned int maxHops = 0;              ///< that a call may take from here on; 0: no limit of our own
    unsigned int maxCalls = 4000;          ///< at the same time; 0: no limit
    unsigned int maxCallsPerSecond = 200;  ///< 0: no limit
    unsigned int maxCallsPerSource = 2000; ///< of one address at the same time; 0: no limit
    std::string recording;                 ///< the recorder's file; empty: in memory
    unsigned int recordingSize = 4194304;  ///< octets; 0: nothing is recorded
    bool relaysMedia = false;              ///< through ports of ours; else the peers exchange them directly
    MediaOptions media;
    ControlOptions control;
    RecordOptions records;
    MetricOptions metrics;
    CaptureOptions capture;
    unsigned int clearAfter = 10; ///< seconds that calls may go on after the request to end
    std::vector<Route> routes;
    DialPlan dialPlan;
    std::set<std::string> interfaces;            ///< the names of all
    std::map<std::string, std::string> moduleOf; ///< by an interface's name, that of its module
    /// By the module's name, its interfaces. Each has a `name` that no other interface has.
    std::map<std::string, std::vector<ConfigurationSection>> modules;

    /// Throws ConfigurationError.
    static Configuration READ(std::string const& file);
    /// The same from the text itself; `file` names it in errors.
    static Configuration PARSE(std::string_view text, std::string const& file);
};
