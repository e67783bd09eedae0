#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

TEST(DrivenClock, StandsStillUntilItIsMoved)
{
    DrivenClock clock;
    EXPECT_EQ(TY::Time::NOW(TY::Time::MONOTONIC), (TY::Time{1000, 0}));
    EXPECT_EQ(TY::Time::NOW(TY::Time::REALTIME), (TY::Time{1000, 0}));
    clock.advance(2500);
    EXPECT_EQ(TY::Time::NOW(TY::Time::MONOTONIC), (TY::Time{1002, 500000000}));
    clock.advance(600);
    EXPECT_EQ(TY::Time::NOW(TY::Time::REALTIME), (TY::Time{1003, 100000000}));
}

TEST(DrivenClock, CanStepBack)
{
    DrivenClock clock;
    clock.advance(-1);
    EXPECT_EQ(clock.getTime(), (TY::Time{999, 999000000}));
    clock.advance(-2999);
    EXPECT_EQ(clock.getTime(), (TY::Time{997, 0}));
    clock.set({5, 7});
    EXPECT_EQ(TY::Time::NOW(TY::Time::MONOTONIC), (TY::Time{5, 7}));
}

TEST(DrivenClock, TheSystemsClockComesBack)
{
    {
        DrivenClock clock;
        clock.set({-1000, 0});
    }
    EXPECT_GE(TY::Time::NOW(TY::Time::MONOTONIC).seconds, 0);
}

TEST(DrivenClock, ASecondOneBeginsAnew)
{
    {
        DrivenClock clock;
        clock.advance(5000);
    }
    DrivenClock const clock;
    EXPECT_EQ(clock.getTime(), (TY::Time{DrivenClock::FIRST_SECOND, 0}));
}
