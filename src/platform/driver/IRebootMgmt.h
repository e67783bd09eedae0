#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"
#include "platform/driver/IDriverInterface.h"

/// The gateway's reboot management: who holds a graceful lock keeps the device from reloading until it is given back.
/// Implemented by the platform's driver, registered with DRIVER.
class CC_EXPORT IRebootMgmt : public IDriverInterface
{
public:
    ~IRebootMgmt() override;
    /// Takes the lock in the name of `owner`; `reason` is shown to whoever waits for the reload. `flags`: 0.
    virtual XCode addGracefulLock(String const& owner, String const& reason, int flags) = 0;
    /// Gives the owner's lock back.
    virtual XCode releaseGracefulLock(String const& owner) = 0;
};
