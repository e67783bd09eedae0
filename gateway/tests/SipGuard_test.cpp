#include "sip/stack/SipGuard.h"

#include "sip/stack/SipStack.h"

#include <gtest/gtest.h>

#include <sofia-sip/su_time.h>

namespace
{
su_duration_t BETWEEN(su_time_t earlier, su_time_t later) { return su_duration(later, earlier); }
} // namespace

TEST(SipGuard, TheStackAsksItOverEitherVersionOfTheInternetProtocol)
{
    SipStack stack;
    EXPECT_NO_THROW(SipGuard::PROVE(stack, "127.0.0.1"));
    EXPECT_NO_THROW(SipGuard::PROVE(stack, "127.0.0.1")); // proven
}

TEST(SipGuard, AWaitForATimerIsNeverShorterThanTheTimer)
{
    EXPECT_EQ(BETWEEN({7, 0}, {7, 1}), 1);
    EXPECT_EQ(BETWEEN({7, 0}, {7, 1000}), 1);
    EXPECT_EQ(BETWEEN({7, 0}, {7, 1001}), 2);
    EXPECT_EQ(BETWEEN({7, 999999}, {8, 0}), 1);
    EXPECT_EQ(BETWEEN({7, 500000}, {9, 250000}), 1750);
    EXPECT_EQ(BETWEEN({7, 0}, {7, 0}), 0);
    EXPECT_EQ(BETWEEN({7, 1500}, {7, 0}), -1);
    EXPECT_EQ(BETWEEN({9, 0}, {7, 0}), -2000);
    EXPECT_EQ(BETWEEN({0, 0}, {4000000000, 0}), SU_DURATION_MAX);
    EXPECT_EQ(BETWEEN({4000000000, 0}, {0, 0}), -SU_DURATION_MAX);
}
