#pragma once

#include "tests/simulation/Values.h"

namespace Simulation
{
/// What a filter does to the properties that cross an endpoint.
struct FilterRule
{
    enum What : unsigned char
    {
        RENAME,    // sets Name to a text
        DROP,      // removes a property
        DERIVE,    // Display becomes what Name is, if that is a text
        TRANSLATE, // replaces a number that is there
        FAIL,      // changes nothing and says so
        ADD,       // sets a property
        THROW,     // as one that lacks memory
        NUMBER_OF_RULES
    };

    What what = RENAME;
    unsigned int parameter = 0;

    static FilterRule CHOOSE(unsigned int what, unsigned int parameter)
    {
        return {static_cast<What>(what % NUMBER_OF_RULES), parameter};
    }
    /// What it removes.
    unsigned int getDroppedId() const;
    /// What it sets.
    Property getAdded() const { return Values::CHOOSE(parameter, parameter / 7); }
    /// Whether it may keep a leg from becoming RELEASED when it is an input filter.
    bool mayHideState() const { return what == FAIL || what == THROW || (what == DROP && parameter % 16 == 15); }
};
} // namespace Simulation
