#pragma once

#include "platform/base/Export.h"
#include "platform/base/TYCounted.h"

/// The base of the interfaces that drivers offer through DRIVER.
class CC_EXPORT IDriverInterface : public TYCounted
{
public:
    ~IDriverInterface() override;
};
