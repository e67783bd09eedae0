#pragma once

#include "isdn/link/LibPri.h"
#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyTariff.h"

/// Advice of charge (ITU-T Q.956.2, EN 300 182-1) between the operations of the facility element and the properties,
/// which have the standard's own types: AOC-D and AOC-E are the property Charge, with the types of charging information
/// subTotal and total; AOC-S is the property Tariff.
///
/// What the property does not hold is left behind: the charging association of AOC-E. A value out of a type's range is
/// none: it is passed over in a list, and not available elsewhere.
namespace IsdnCharge
{
using Charge = CC_PropertyCharge::Charge;
using Tariff = CC_PropertyTariff::Tariff;

/// From the wire. Throws std::bad_alloc. @{
Charge OF_D(pri_subcmd_aoc_d const& advice);
Charge OF_E(pri_subcmd_aoc_e const& advice);
Tariff OF_S(pri_subcmd_aoc_s const& advice);
/// @}

/// Whether a charge is the final one, which belongs to the end of the call.
bool IS_TOTAL(Charge const& charge);
/// To the wire. @{
pri_subcmd_aoc_d TO_D(Charge const& charge);
pri_subcmd_aoc_e TO_E(Charge const& charge);
pri_subcmd_aoc_s TO_S(Tariff const& tariff);
/// @}
} // namespace IsdnCharge
