// Takes whatever it is given for operations, eight octets each, and carries them out as the simulator does
// (docs/testing.md). A run that fails is printed as a file that `./run simulate --replay` runs again.
#include "tests/simulation/Operation.h"
#include "tests/simulation/Run.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace
{
constexpr std::size_t MOST_OPERATIONS = 256; // what more can find, fewer can
} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    Simulation::PREPARE_RUNS();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* octets, std::size_t length)
{
    Simulation::Operations operations = Simulation::FROM_OCTETS(octets, length);
    if (operations.size() > MOST_OPERATIONS)
        operations.resize(MOST_OPERATIONS);
    Simulation::Outcome const outcome = Simulation::RUN(operations);
    if (!outcome.hasFailed())
        return 0;
    std::fputs(Simulation::TO_TEXT(operations, outcome.failure).c_str(), stderr);
    std::abort();
}
