#pragma once

#include "tests/simulation/Operation.h"

#include <atomic>
#include <string>

namespace Simulation
{
/// How a run went.
struct Outcome
{
    std::string failure;          // empty: none
    unsigned long operations = 0; // carried out, the nested ones included
    bool hasFailed() const { return !failure.empty(); }
};

/// Carries the operations out in a world of their own and holds it to the invariants. `progress` (may be null) says
/// which operation of the stream is under way, for who finds the run crashed.
Outcome RUN(Operations const& operations, std::atomic<std::size_t>* progress = nullptr);

/// Once, before the first run: makes what the library and the simulator keep for the life of the process.
void PREPARE_RUNS();
} // namespace Simulation
