#include "host/RebootLock.h"

#include "platform/base/TYPtr.h"

#include <gtest/gtest.h>

TEST(RebootLock, CountsWhatIsTakenAndRefusesWhatWasNot)
{
    TYPtr<RebootLock> const lock(new RebootLock);
    EXPECT_TRUE(lock->addGracefulLock("Call-Control", "Calls are ongoing", 0).isOk());
    EXPECT_EQ(lock->getNumberOfLocks(), 1u);
    EXPECT_TRUE(lock->releaseGracefulLock("Call-Control").isOk());
    EXPECT_EQ(lock->getNumberOfLocks(), 0u);
    EXPECT_EQ(lock->releaseGracefulLock("Call-Control"), XCode::REFUSED);
}
