#pragma once

#include "platform/base/XCode.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// The device's reboot management: records who takes and gives back graceful locks. Registered with DRIVER while it
/// lives, under its own name; a pool that has found it may outlive it and then records nothing more. Its end is a line,
/// too: "reboot: ended", or "reboot: ended (locks held: 1)".
///
///     FakeRebootMgmt reboot;
///     CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
///     EXPECT_EQ(reboot.take(), (Lines{"reboot: add Call-Control (Calls are ongoing, 0)"}));
///     CallControl::RELEASE_CALL("SWITCH", call);
///     EXPECT_EQ(reboot.take(), (Lines{"reboot: release Call-Control"}));
class FakeRebootMgmt : public Recorder
{
public:
    /// Without memory it is not registered.
    explicit FakeRebootMgmt(std::string name = "reboot", Journal* journal = nullptr);
    ~FakeRebootMgmt();

    /// Locks taken and not given back.
    int getNumberOfLocks() const { return m_locks; }

    XCode m_result = XCode::OK; ///< what both operations answer
    Hook<void()> m_onAdd;       ///< these run inside the operation, after the line is written
    Hook<void()> m_onRelease;   ///< the same, of a lock that is given back

private:
    class Interface;

    Interface* m_interface;
    int m_locks = 0;
};
