#include "testing/FakeRebootMgmt.h"

#include "platform/driver/DRIVER.h"
#include "platform/driver/IRebootMgmt.h"

#include <gtest/gtest.h>

namespace
{
TYPtr<IRebootMgmt> FIND()
{
    TYVector<TYPtr<IRebootMgmt>> found;
    EXPECT_TRUE(DRIVER::INSTANCE().getDriverInterfaces(found, TY::UUID::INVALID(), String::s_empty).isOk());
    return found.isEmpty() ? TYPtr<IRebootMgmt>() : found[0];
}
} // namespace

TEST(FakeRebootMgmt, IsFoundWhileItLives)
{
    {
        FakeRebootMgmt const reboot;
        EXPECT_TRUE(FIND());
    }
    EXPECT_FALSE(FIND());
}

TEST(FakeRebootMgmt, IsFoundUnderItsName)
{
    FakeRebootMgmt const first("first");
    FakeRebootMgmt second("second");
    TYVector<TYPtr<IRebootMgmt>> found;
    EXPECT_EQ(DRIVER::INSTANCE().getDriverInterfaces(found, TY::UUID::INVALID(), "second"), XCode::OK);
    ASSERT_EQ(found.getSize(), 1u);
    EXPECT_EQ(found[0]->addGracefulLock("me", "because", 0), XCode::OK);
    EXPECT_EQ(second.take(), Lines{"second: add me (because, 0)"});
}

TEST(FakeRebootMgmt, RecordsItsEndAndTheLocksThatAreHeldThen)
{
    Journal journal;
    {
        FakeRebootMgmt const none("none", &journal);
    }
    TYPtr<IRebootMgmt> found;
    {
        FakeRebootMgmt const one("one", &journal);
        found = FIND();
        EXPECT_EQ(found->addGracefulLock("me", "because", 0), XCode::OK);
    }
    EXPECT_EQ(found->releaseGracefulLock("me"), XCode::FAILURE);
    EXPECT_EQ(journal.take(), (Lines{"none: ended", "one: add me (because, 0)", "one: ended (locks held: 1)"}));
}

TEST(FakeRebootMgmt, RecordsLocksWithTheirTexts)
{
    FakeRebootMgmt reboot;
    TYPtr<IRebootMgmt> const found = FIND();
    EXPECT_EQ(found->addGracefulLock("me", "because", 2), XCode::OK);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1);
    EXPECT_EQ(found->releaseGracefulLock("me"), XCode::OK);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
    EXPECT_EQ(reboot.take(), (Lines{"reboot: add me (because, 2)", "reboot: release me"}));
}

TEST(FakeRebootMgmt, AnswersWhatTheTestSaysAndRunsItsHooks)
{
    FakeRebootMgmt reboot;
    TYPtr<IRebootMgmt> const found = FIND();
    int runs = 0;
    reboot.m_result = XCode::REFUSED;
    reboot.m_onAdd = [&] { runs += 1; };
    reboot.m_onRelease = [&] { runs += 10; };
    EXPECT_EQ(found->addGracefulLock("me", "because", 0), XCode::REFUSED);
    EXPECT_EQ(found->releaseGracefulLock("me"), XCode::REFUSED);
    EXPECT_EQ(runs, 11);
}

TEST(FakeRebootMgmt, MayBeOutlivedByWhoFoundIt)
{
    TYPtr<IRebootMgmt> found;
    {
        FakeRebootMgmt const reboot;
        found = FIND();
    }
    EXPECT_EQ(found->addGracefulLock("me", "because", 0), XCode::FAILURE);
    EXPECT_EQ(found->releaseGracefulLock("me"), XCode::FAILURE);
}
