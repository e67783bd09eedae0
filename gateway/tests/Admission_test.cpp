#include "host/Admission.h"

#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

TEST(Admission, WithoutLimitsEveryCallMayBegin)
{
    Admission admission(0, 0);
    for (unsigned int i = 0; i < 1000; ++i)
        EXPECT_TRUE(admission.admit(i));
}

TEST(Admission, AsManyCallsAsAllowedMayBeUp)
{
    Admission admission(3, 0);
    EXPECT_TRUE(admission.admit(2));
    EXPECT_FALSE(admission.admit(3));
    EXPECT_FALSE(admission.admit(4));
    EXPECT_TRUE(admission.admit(0));
}

TEST(Admission, ABurstOfOneSecondsWorthIsAllowedAndThenTheRate)
{
    DrivenClock clock;
    Admission admission(0, 10);
    for (int i = 0; i < 10; ++i)
        EXPECT_TRUE(admission.admit(0));
    EXPECT_FALSE(admission.admit(0));
    clock.advance(99);
    EXPECT_FALSE(admission.admit(0));
    clock.advance(2);
    EXPECT_TRUE(admission.admit(0));
    EXPECT_FALSE(admission.admit(0));
}

TEST(Admission, AQuietTimeSavesNoMoreThanOneSecondsWorth)
{
    DrivenClock clock;
    Admission admission(0, 2);
    EXPECT_TRUE(admission.admit(0));
    clock.advance(60000);
    EXPECT_TRUE(admission.admit(0));
    EXPECT_TRUE(admission.admit(0));
    EXPECT_FALSE(admission.admit(0));
}

TEST(Admission, ACallRefusedForTheNumberOfCallsDoesNotCountTowardsTheRate)
{
    DrivenClock clock;
    Admission admission(1, 1);
    EXPECT_FALSE(admission.admit(1));
    EXPECT_TRUE(admission.admit(0));
}
