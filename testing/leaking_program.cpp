// Tests that leak on purpose, for LeakCheck_test to start as a program of its own.
#include "calls/CC_CallLeg.h"

#include <gtest/gtest.h>

namespace
{
CC_CallLeg* s_leaked = nullptr; // kept reachable: this is about our counters, not about a leak checker's
} // namespace

TEST(Leaking, LeavesALegBehind)
{
    s_leaked = new CC_CallLeg;
    EXPECT_NE(s_leaked, nullptr);
}

TEST(Leaking, EndsWhatAnotherLeftBehind)
{
    ASSERT_NE(s_leaked, nullptr);
    s_leaked->removeReference();
    s_leaked = nullptr;
}

TEST(Leaking, LeavesNothingBehind)
{
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(leg->getCall(), nullptr);
    leg->removeReference();
}
