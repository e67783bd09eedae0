#include "host/Admission.h"

#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

namespace
{
constexpr InternetAddress SOURCE = {1};
constexpr InternetAddress OTHER = {2};
} // namespace

TEST(Admission, WithoutLimitsEveryCallMayBegin)
{
    Admission admission(0, 0);
    for (unsigned int i = 0; i < 1000; ++i)
        EXPECT_TRUE(admission.admit(i, SOURCE));
}

TEST(Admission, AsManyCallsAsAllowedMayBeUp)
{
    Admission admission(3, 0);
    EXPECT_TRUE(admission.admit(2, SOURCE));
    EXPECT_FALSE(admission.admit(3, SOURCE));
    EXPECT_FALSE(admission.admit(4, SOURCE));
    EXPECT_TRUE(admission.admit(0, SOURCE));
}

TEST(Admission, ABurstOfOneSecondsWorthIsAllowedAndThenTheRate)
{
    DrivenClock clock;
    Admission admission(0, 10);
    for (int i = 0; i < 10; ++i)
        EXPECT_TRUE(admission.admit(0, SOURCE));
    EXPECT_FALSE(admission.admit(0, SOURCE));
    clock.advance(99);
    EXPECT_FALSE(admission.admit(0, SOURCE));
    clock.advance(2);
    EXPECT_TRUE(admission.admit(0, SOURCE));
    EXPECT_FALSE(admission.admit(0, SOURCE));
}

TEST(Admission, AQuietTimeSavesNoMoreThanOneSecondsWorth)
{
    DrivenClock clock;
    Admission admission(0, 2);
    EXPECT_TRUE(admission.admit(0, SOURCE));
    clock.advance(60000);
    EXPECT_TRUE(admission.admit(0, SOURCE));
    EXPECT_TRUE(admission.admit(0, SOURCE));
    EXPECT_FALSE(admission.admit(0, SOURCE));
}

TEST(Admission, ACallRefusedForTheNumberOfCallsDoesNotCountTowardsTheRate)
{
    DrivenClock clock;
    Admission admission(1, 1);
    EXPECT_FALSE(admission.admit(1, SOURCE));
    EXPECT_TRUE(admission.admit(0, SOURCE));
}

TEST(Admission, OneSourceCannotTakeAllTheRoom)
{
    Admission admission(10, 0, 2);
    admission.begin(SOURCE);
    EXPECT_TRUE(admission.admit(1, SOURCE));
    admission.begin(SOURCE);
    EXPECT_FALSE(admission.admit(2, SOURCE));
    EXPECT_TRUE(admission.admit(2, OTHER));
    admission.end(SOURCE);
    EXPECT_TRUE(admission.admit(1, SOURCE));
    admission.end(SOURCE);
    admission.end(SOURCE); // of nothing
    EXPECT_TRUE(admission.admit(0, SOURCE));
}
