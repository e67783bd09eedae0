#pragma once

namespace Simulation
{
class World;

// What holds whatever was done. The first that does not makes the run fail.

/// Cheap ones, after each operation of the stream.
void CHECK_AFTER_OPERATION(World& world);
/// When nothing is left to do: calls without live legs are gone, views follow, locks and statistics add up.
void CHECK_AT_REST(World& world);
/// Before everything is taken back.
void CHECK_AT_THE_END(World& world);
} // namespace Simulation
