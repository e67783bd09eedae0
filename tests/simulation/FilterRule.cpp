#include "tests/simulation/FilterRule.h"

#include "properties/CC_PropertyId.h"

unsigned int Simulation::FilterRule::getDroppedId() const
{
    return parameter % 16 == 15 ? CC_PropertyId::STATE : Values::CHOOSE(parameter, 0).id;
}
