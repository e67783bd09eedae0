#pragma once

#include "services/CC_Service.h"

#include <functional>

namespace Simulation
{
constexpr unsigned int NUMBER_OF_SERVICES = 6;

/// The services, of which the first is user input and the second its update.
void WITH_SERVICE(unsigned int which, unsigned int text, std::function<void(CC_Service&)> const& use);
} // namespace Simulation
