#include "platform/base/NestingGuard.h"

#include <gtest/gtest.h>

TEST(NestingGuard, OnlyTheFirstOfNestedGuardsIsOutermost)
{
    unsigned int depth = 0;
    {
        NestingGuard const outer(depth);
        EXPECT_TRUE(outer.isOutermost());
        {
            NestingGuard const inner(depth);
            EXPECT_FALSE(inner.isOutermost());
            EXPECT_EQ(2U, depth);
        }
        EXPECT_TRUE(outer.isOutermost());
    }
    EXPECT_EQ(0U, depth);
}
