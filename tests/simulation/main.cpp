// Simulates call control: runs that follow from a number alone, held to the invariants and to a model. See
// docs/testing.md.
#include "tests/simulation/Attempts.h"
#include "tests/simulation/Generator.h"
#include "tests/simulation/Ladder.h"
#include "tests/simulation/Run.h"
#include "tests/simulation/Shrinker.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <sys/wait.h>
#include <unistd.h>

using namespace Simulation;
using Clock = std::chrono::steady_clock;

namespace
{
struct Arguments
{
    unsigned long seconds = 10;
    unsigned long operations = 0; // 0: as many as the time allows
    std::uint64_t seed = 0;
    std::string replay;
    std::string output = "simulation-failure.txt";
    bool isToShrink = true;
    bool isToRecord = false;
};

int USAGE()
{
    std::fputs("usage: callcontrol-simulate [--seconds N] [--operations N] [--seed S] [--output FILE] [--no-shrink]\n"
               "       callcontrol-simulate --replay FILE-OR-FOLDER [--shrink FILE]\n"
               "       callcontrol-simulate --records --seed S [--operations N]\n",
               stderr);
    return 2;
}

bool READ(int count, char** texts, Arguments& arguments)
{
    std::random_device random;
    arguments.seed = random() % 1000000000;
    for (int i = 1; i < count; ++i)
    {
        std::string const name = texts[i];
        if (name == "--no-shrink")
        {
            arguments.isToShrink = false;
            continue;
        }
        if (name == "--records")
        {
            arguments.isToRecord = true;
            continue;
        }
        if (++i == count)
            return false;
        if (name == "--seconds")
            arguments.seconds = std::strtoul(texts[i], nullptr, 10);
        else if (name == "--operations")
            arguments.operations = std::strtoul(texts[i], nullptr, 10);
        else if (name == "--seed")
            arguments.seed = std::strtoull(texts[i], nullptr, 10);
        else if (name == "--replay")
            arguments.replay = texts[i];
        else if (name == "--output")
            arguments.output = texts[i];
        else
            return false;
    }
    return true;
}

/// In a process of its own, so that one that crashes can be told of: seeds one after another until the time is over.
[[noreturn]] void RUN_SEEDS(Arguments const& arguments)
{
    Report& report = SHARED_REPORT();
    auto const end = Clock::now() + std::chrono::seconds(arguments.seconds);
    for (std::uint64_t seed = arguments.seed;; ++seed)
    {
        report.seed = seed;
        if (seed % 64 == 0 || seed == arguments.seed)
            LIMIT_TIME();
        Outcome const outcome = RUN(GENERATE(seed), &report.progress);
        report.operations += outcome.operations;
        ++report.runs;
        report.setFailure(outcome.failure);
        if (outcome.hasFailed())
            _exit(1);
        bool const isEnough = arguments.operations != 0 && report.operations >= arguments.operations;
        if (isEnough || (arguments.operations == 0 && Clock::now() >= end))
            _exit(0);
    }
}

int TELL(Operations const& operations, Ended const& ended, Arguments const& arguments, std::string const& remarks)
{
    std::printf("FAILED: %s\n", ended.how.c_str());
    Operations const smallest =
        arguments.isToShrink ? Shrinker(std::chrono::seconds(50)).shrink(operations) : operations;
    Ladder const ladder(arguments.output + ".ring");
    Ended const again = ATTEMPT(smallest, false);
    std::string const how = again.hasFailed ? again.how : ended.how;
    std::string const text = TO_TEXT(smallest, how + "\n" + remarks);
    std::ofstream(arguments.output) << text;
    std::ofstream(arguments.output + ".ladder") << ladder.getText();
    std::printf("%zu of %zu operations are left:\n\n%s\n%s\nwritten to %s and %s.ladder; run it again with --replay\n",
                smallest.size(), operations.size(), text.c_str(), ladder.getText().c_str(), arguments.output.c_str(),
                arguments.output.c_str());
    return 1;
}

int SIMULATE(Arguments const& arguments)
{
    std::printf("seed %llu\n", static_cast<unsigned long long>(arguments.seed));
    std::fflush(nullptr);
    auto const begin = Clock::now();
    Report const& report = SHARED_REPORT();
    pid_t const child = fork();
    if (child == 0)
        RUN_SEEDS(arguments);
    int status = 0;
    waitpid(child, &status, 0);
    double const seconds = std::chrono::duration<double>(Clock::now() - begin).count();
    auto const operations = static_cast<double>(report.operations.load());
    std::printf("%.0f operations in %llu runs, %.1f s: %.2f million a minute\n", operations,
                static_cast<unsigned long long>(report.runs.load()), seconds, operations / seconds * 60 / 1e6);
    Ended const ended = ENDED(status);
    if (!ended.hasFailed)
        return 0;
    return TELL(GENERATE(report.seed), ended, arguments, "seed " + std::to_string(report.seed.load()));
}

/// The same for the same seed, in every process and on every day.
int RECORD(Arguments const& arguments)
{
    std::size_t operations = 0;
    for (std::uint64_t seed = arguments.seed; operations <= arguments.operations; ++seed)
    {
        Operations const generated = GENERATE(seed);
        operations += generated.size();
        std::printf("%llu: %s\n", static_cast<unsigned long long>(seed), RECORDS_OF(generated).c_str());
    }
    return 0;
}

int REPLAY_FILE(std::filesystem::path const& path, Arguments const& arguments)
{
    std::ifstream stream(path);
    std::string const text((std::istreambuf_iterator<char>(stream)), std::istreambuf_iterator<char>());
    Operations operations;
    std::string error;
    if (!stream || !FROM_TEXT(text, operations, error))
    {
        std::fprintf(stderr, "%s: %s\n", path.c_str(), error.c_str());
        return 2;
    }
    Ended const ended = ATTEMPT(operations, false);
    std::printf("%s: %s\n", path.filename().c_str(), ended.hasFailed ? ended.how.c_str() : "passed");
    if (ended.hasFailed && arguments.output != "simulation-failure.txt")
        std::ignore = TELL(operations, ended, arguments, "");
    return ended.hasFailed ? 1 : 0;
}

int REPLAY(Arguments const& arguments)
{
    if (!std::filesystem::is_directory(arguments.replay))
        return REPLAY_FILE(arguments.replay, arguments);
    std::vector<std::filesystem::path> paths;
    for (auto const& entry : std::filesystem::directory_iterator(arguments.replay))
        if (entry.path().extension() == ".txt")
            paths.push_back(entry.path());
    std::sort(paths.begin(), paths.end());
    int result = 0;
    for (auto const& path : paths)
        result = std::max(result, REPLAY_FILE(path, arguments));
    std::printf("%zu inputs\n", paths.size());
    return result;
}
} // namespace

int main(int count, char** texts)
{
    Arguments arguments;
    if (!READ(count, texts, arguments))
        return USAGE();
    PREPARE_RUNS();
    if (arguments.isToRecord)
        return RECORD(arguments);
    return arguments.replay.empty() ? SIMULATE(arguments) : REPLAY(arguments);
}
