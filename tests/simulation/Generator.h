#pragma once

#include "tests/simulation/Operation.h"

#include <cstdint>

namespace Simulation
{
/// A run from a number: mostly honest modules that hold calls, in half of the runs with everything that may be done to
/// them in the middle.
Operations GENERATE(std::uint64_t seed);
} // namespace Simulation
