// callcontrol-gateway: peers of its signalling modules call each other through the call-control library. README.md
// tells how it is used.
#include "Gateway.h"
#include "host/ModuleLoader.h"
#include "host/Routing.h"
#include "operation/Log.h"
#include "operation/Output.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <ctime>
#include <exception>
#include <string>
#include <sys/resource.h>
#include <unistd.h>
#include <utility>
#include <vector>

/// For jemalloc, where the gateway has it: one arena, since one thread has nearly all; what has not been used for five
/// seconds goes back to the system.
extern "C" char const* malloc_conf; // its name for it
char const* malloc_conf = "narenas:1,dirty_decay_ms:5000,muzzy_decay_ms:0";

namespace
{
/// Exit statuses.
constexpr int ALL_RIGHT = 0;
constexpr int LEFT_OVERS = 1;   ///< or any other fault of ours
constexpr int CANNOT_SERVE = 2; ///< the command line, the configuration or a port

struct Arguments
{
    std::string file;
    bool isCheck = false;
    unsigned int tracedCalls = 0;
    std::string logLevel;
    std::string routed; // the number of a dry run
    std::string from;
    std::string calling;
    std::string user;
    std::string modules = ModuleLoader::GET_INSTALLED_FOLDER();
};

int COMPLAIN(char const* what)
{
    std::fprintf(stderr, "callcontrol-gateway: %s\n", what);
    return CANNOT_SERVE;
}

void DECLARE(CLI::App& app, Arguments& arguments)
{
    app.add_option("-c,--config", arguments.file, "The configuration file (TOML)")->required();
    app.add_flag("--check", arguments.isCheck, "Only read the configuration file");
    app.add_option("--trace-calls", arguments.tracedCalls, "Print a ladder of each of the first N calls");
    auto* const route = app.add_option("--route", arguments.routed, "Only tell where a call to this number leaves");
    app.add_option("--from", arguments.from, "The interface on which that call comes in")->needs(route);
    app.add_option("--calling", arguments.calling, "The number of its caller")->needs(route);
    app.add_option("--user", arguments.user, "As whom the interface knows its caller")->needs(route);
    app.add_option("--modules", arguments.modules, "The folder of the signalling modules");
    app.add_option("--log-level", arguments.logLevel, "Instead of the configuration's log-level")
        ->check(CLI::IsMember({"trace", "debug", "info", "warning", "error", "off"}));
}

/// A line with its calls takes 61 descriptors, a call with media four: the usual soft limit of 1024 is for programs
/// that wait for theirs with select.
void TAKE_ALL_DESCRIPTORS()
{
    rlimit limit = {};
    if (getrlimit(RLIMIT_NOFILE, &limit) != 0)
        return;
    limit.rlim_cur = limit.rlim_max;
    setrlimit(RLIMIT_NOFILE, &limit);
}

int SERVE(Configuration const& configuration, Gateway::Modules modules, unsigned int tracedCalls)
{
    Counters counters;
    TAKE_ALL_DESCRIPTORS();
    {
        Gateway gateway(configuration, std::move(modules), tracedCalls);
        gateway.run();
        counters = gateway.getCounters();
    }
    unsigned int const leftOver = Gateway::GET_NUMBER_OF_LEFT_OVERS();
    std::printf("gateway: %llu calls placed, %llu answered, %llu cleared, %llu failed, %u left over\n", counters.placed,
                counters.answered, counters.cleared, counters.failed, leftOver);
    std::fflush(stdout);
    return leftOver == 0 ? ALL_RIGHT : LEFT_OVERS;
}

/// Every route for the number, the one that is taken first, and why the others are not.
int TELL_ROUTE(Configuration const& configuration, Arguments const& arguments)
{
    if (!configuration.interfaces.contains(arguments.from))
        return COMPLAIN(("there is no interface '" + arguments.from + "'").c_str());
    Routing const routing(configuration.routes);
    bool const isWhole = routing.isEmergency(arguments.from, arguments.routed);
    std::string const number = isWhole ? arguments.routed : configuration.dialPlan.normalise(arguments.routed);
    std::string const calling = configuration.dialPlan.normalise(arguments.calling);
    if (number != arguments.routed)
        std::printf("%s is %s\n", arguments.routed.c_str(), number.c_str());
    Routing::Question question{arguments.from, number, calling};
    question.minuteOfWeek = WeekHours::MINUTE_OF(std::time(nullptr));
    question.user = arguments.user;
    for (std::string const& line : routing.explain(question))
        std::puts(line.c_str());
    if (routing.find(question).empty())
        std::printf("%s from %s: no route, 404 with cause 3\n", number.c_str(), arguments.from.c_str());
    return ALL_RIGHT;
}

int RUN(Arguments const& arguments)
{
    Configuration configuration = Configuration::READ(arguments.file);
    if (!arguments.routed.empty())
        return TELL_ROUTE(configuration, arguments);
    Gateway::Modules modules;
    for (auto const& [name, interfaces] : configuration.modules)
        modules[name] = ModuleLoader(arguments.modules).load(name, configuration);
    if (arguments.isCheck)
    {
        std::printf("%s: all right\n", arguments.file.c_str());
        return ALL_RIGHT;
    }
    Gateway::BLOCK_SIGNALS();
    configuration.isLogLevelFixed = !arguments.logLevel.empty();
    if (configuration.isLogLevelFixed)
        configuration.logLevel = arguments.logLevel;
    if (!SET_UP_LOG(configuration.logLevel, configuration.logFile))
        throw ConfigurationError(arguments.file, "gateway.log-file", "the file cannot be opened");
    static Output output(STDOUT_FILENO);
    stdout = output.makeStream(); // whoever prints, for now and ever
    static MonitorWriter writer;
    RTD::REPOSITORY::SET_WRITER(&writer);
    SET_LOG_LEVELS(configuration.logLevel, configuration.callControlLogLevel);
    return SERVE(configuration, std::move(modules), arguments.tracedCalls);
}

/// Reads the command line and runs; what is wrong with either is told in one line.
int START(int argc, char** argv)
{
    Arguments arguments;
    CLI::App app("A media gateway's call control between its signalling modules");
    DECLARE(app, arguments);
    try
    {
        app.parse(argc, argv);
        return RUN(arguments);
    }
    catch (CLI::Success const& help)
    {
        return app.exit(help);
    }
    catch (CLI::Error const& error)
    {
        return COMPLAIN(error.what());
    }
    catch (ConfigurationError const& error)
    {
        return COMPLAIN(error.what());
    }
}
} // namespace

int main(int argc, char** argv)
{
    try
    {
        return START(argc, argv);
    }
    catch (std::exception const& error)
    {
        std::fprintf(stderr, "callcontrol-gateway: %s\n", error.what());
        return LEFT_OVERS;
    }
}
