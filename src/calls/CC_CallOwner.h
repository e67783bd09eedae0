#pragma once

#include "platform/base/Export.h"

class CC_Call;

/// What hands calls out and takes them back, as a call knows it: CC_CallPool.
class CC_EXPORT CC_CallOwner
{
public:
    /// Takes the call back and destroys it. Null is ignored.
    virtual void releaseCall(CC_Call* call) = 0;

protected:
    virtual ~CC_CallOwner() = default; // nobody destroys an owner through this
};
