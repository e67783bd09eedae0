#pragma once

namespace Simulation
{
class World;

/// A run has failed and its world still stands: the place to print what happened, in the order in which it happened, as
/// whoever records it can tell. Nobody records yet.
void PRINT_LADDER(World const& world);
} // namespace Simulation
