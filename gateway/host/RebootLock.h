#pragma once

#include "platform/driver/IRebootMgmt.h"

/// Reboot management of a process that is not a device: remembers nothing but logs who keeps it from being reloaded.
///
///     TYPtr<RebootLock> const rebootLock(new RebootLock);
///     DRIVER::INSTANCE().addDriverInterface(rebootLock.get(), TY::UUID::INVALID(), "reboot");
class RebootLock : public IRebootMgmt
{
public:
    XCode addGracefulLock(String const& owner, String const& reason, int flags) override;
    XCode releaseGracefulLock(String const& owner) override;

    /// How many locks are held now.
    unsigned int getNumberOfLocks() const { return m_locks; }

private:
    unsigned int m_locks = 0;
};
