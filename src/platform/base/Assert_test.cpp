#include "platform/base/Assert.h"

#include <gtest/gtest.h>

TEST(Assert, AFailedAssertionSaysWhereAndWhatAndAborts)
{
    EXPECT_DEATH(TY::ASSERTION_FAILED("calls/CC_Call.cpp", 12, "index past the end"),
                 "calls/CC_Call.cpp:12: index past the end");
}

#ifdef NDEBUG
TEST(Assert, AReleaseBuildDoesNotEvenEvaluateTheCondition)
{
    bool isEvaluated = false;
    TY_ASSERT(isEvaluated = true, "never printed");
    EXPECT_FALSE(isEvaluated);
}
#else
TEST(Assert, ADebugBuildStopsWhenTheConditionDoesNotHold)
{
    bool isEvaluated = false;
    TY_ASSERT(isEvaluated = true, "holds");
    EXPECT_TRUE(isEvaluated);
    EXPECT_DEATH(TY_ASSERT(!isEvaluated, "does not hold"), "Assert_test.cpp:[0-9]+: does not hold");
}
#endif
