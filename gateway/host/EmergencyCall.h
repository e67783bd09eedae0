#pragma once

#include "properties/CC_PropertyId.h"

/// Marks calls to an emergency number, for whoever tells of calls.
namespace EmergencyCall
{
/// CC_PropertyBoolean, of a call, true; any other call has none
inline constexpr unsigned int PROPERTY = CC_PropertyId::LAST_OF_MODULES;
} // namespace EmergencyCall
