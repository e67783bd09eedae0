#pragma once

#include "tests/simulation/Operation.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>

namespace Simulation
{
/// What a process that runs attempts tells the one that waits for it, also when it crashes.
struct Report
{
    std::atomic<std::uint64_t> seed;
    std::atomic<std::uint64_t> runs;
    std::atomic<std::uint64_t> operations;
    std::atomic<std::size_t> progress;
    char failure[4096];

    void setFailure(std::string const& text);
};

/// In memory that a forked process shares; lives as long as the process.
Report& SHARED_REPORT();

/// From now on this process ends when some runs would have long ended: by the time of the processor, which is not the
/// machine's when that is busy, and by the clock for who waits for ever.
void LIMIT_TIME();

/// How a run ended that was made in a process of its own.
struct Ended
{
    bool hasFailed = false;
    std::string how{};    // the failure, or the signal
    bool isCrash = false; // the run did not end by itself
};

/// Runs the operations in a forked process, silently if `isSilent`. One that takes longer than a few seconds hangs.
Ended ATTEMPT(Operations const& operations, bool isSilent);

/// What the status of a process that ran attempts means.
Ended ENDED(int status);
} // namespace Simulation
