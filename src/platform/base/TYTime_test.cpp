#include "platform/base/TYTime.h"

#include <ctime>
#include <gtest/gtest.h>

namespace
{
TY::Time FAKE_CLOCK(unsigned int source) { return {1000 + static_cast<long long>(source), 999999999}; }

bool IS_BEFORE(TY::Time const& left, TY::Time const& right)
{
    return left.seconds != right.seconds ? left.seconds < right.seconds : left.nanoseconds < right.nanoseconds;
}
} // namespace

TEST(TYTime, AReplacedClockIsAskedForTheSource)
{
    TY::Time::SET_CLOCK(FAKE_CLOCK);
    EXPECT_EQ((TY::Time{1000, 999999999}), TY::Time::NOW(TY::Time::MONOTONIC));
    EXPECT_EQ((TY::Time{1001, 999999999}), TY::Time::NOW(TY::Time::REALTIME));
    EXPECT_EQ((TY::Time{1007, 999999999}), TY::Time::NOW(7));
    TY::Time::SET_CLOCK(nullptr);
    EXPECT_FALSE((TY::Time{1000, 999999999}) == TY::Time::NOW(TY::Time::MONOTONIC));
}

TEST(TYTime, TheMonotonicClockNeverStepsBack)
{
    TY::Time last = TY::Time::NOW(TY::Time::MONOTONIC);
    for (unsigned int i = 0; i < 1000; ++i)
    {
        TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
        EXPECT_FALSE(IS_BEFORE(now, last));
        EXPECT_TRUE(now.nanoseconds >= 0 && now.nanoseconds < 1000000000);
        last = now;
    }
}

TEST(TYTime, TheRealTimeClockIsTheTimeOfDay)
{
    long long const before = std::time(nullptr) - 1; // time() may lag behind by a clock tick
    TY::Time const now = TY::Time::NOW(TY::Time::REALTIME);
    EXPECT_GE(now.seconds, before);
    EXPECT_LE(now.seconds, std::time(nullptr) + 1);
}

TEST(TYTime, MomentsCompareByBothFields)
{
    EXPECT_EQ(TY::Time(), (TY::Time{0, 0}));
    EXPECT_FALSE((TY::Time{1, 0}) == (TY::Time{1, 1}));
    EXPECT_FALSE((TY::Time{1, 0}) == (TY::Time{2, 0}));
}
