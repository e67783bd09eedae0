#pragma once

#include "adapters/CC_CallAdapter.h"
#include "calls/CC_CallLeg.h"

// Where an older library that is to be simulated, too, calls something otherwise, or lacks it: SIMULATION_OLD_LIBRARY.

namespace Simulation
{
inline CC_PropertyContainer& PROPERTIES_TO_WRITE(CC_CallLeg& leg)
{
#ifdef SIMULATION_OLD_LIBRARY
    return leg.getProperties();
#else
    return leg.getPropertiesToWrite();
#endif
}

#ifdef SIMULATION_OLD_LIBRARY
inline void FIX_STATE(CC_CallLeg&) {}
inline constexpr bool CAN_BE_COMPARED = false;
inline constexpr bool MAY_FILTERS_KEEP_CALLS = true;
inline CC_CallLeg const* OWN_LEG(CC_CallAdapter const&) { return nullptr; }
inline CC_CallLeg const* PEER_LEG(CC_CallAdapter const&) { return nullptr; }
#else
inline void FIX_STATE(CC_CallLeg& leg) { leg.fixState(); }
inline constexpr bool CAN_BE_COMPARED = true;
inline constexpr bool MAY_FILTERS_KEEP_CALLS = false; // an input filter that hides RELEASED from the leg
inline CC_CallLeg const* OWN_LEG(CC_CallAdapter const& adapter) { return adapter.getOwnCallLeg(); }
inline CC_CallLeg const* PEER_LEG(CC_CallAdapter const& adapter) { return adapter.getPeerCallLeg(); }
#endif
} // namespace Simulation
