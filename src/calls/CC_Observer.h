#pragma once

#include "platform/base/Export.h"

/// The common base of what observes calls and call legs.
class CC_EXPORT CC_Observer
{
public:
    virtual ~CC_Observer();
};
