#include "platform/base/TYLifeline.h"

#include <gtest/gtest.h>
#include <memory>

TEST(TYLifeline, AWatchTellsThatItsObjectEnded)
{
    auto lifeline = std::make_unique<TYLifeline>();
    TYLifeline::Watch const watch(*lifeline);
    EXPECT_TRUE(watch.isAlive());
    lifeline.reset();
    EXPECT_FALSE(watch.isAlive());
}

TEST(TYLifeline, EveryNestedWatchIsTold)
{
    auto lifeline = std::make_unique<TYLifeline>();
    TYLifeline::Watch const outer(*lifeline);
    {
        TYLifeline::Watch const middle(*lifeline);
        {
            TYLifeline::Watch const inner(*lifeline);
            lifeline.reset();
            EXPECT_FALSE(inner.isAlive());
        }
        EXPECT_FALSE(middle.isAlive());
    }
    EXPECT_FALSE(outer.isAlive());
}

TEST(TYLifeline, AWatchThatEndedIsNotTold)
{
    auto lifeline = std::make_unique<TYLifeline>();
    TYLifeline::Watch const outer(*lifeline);
    {
        TYLifeline::Watch const inner(*lifeline);
    }
    lifeline.reset();
    EXPECT_FALSE(outer.isAlive());
}

TEST(TYLifeline, AnObjectIsWatchedDuringTheOperationThatCalledOut)
{
    TYLifeline lifeline;
    EXPECT_FALSE(lifeline.isWatched());
    {
        TYLifeline::Watch const outer(lifeline);
        {
            TYLifeline::Watch const inner(lifeline);
            EXPECT_TRUE(lifeline.isWatched());
        }
        EXPECT_TRUE(lifeline.isWatched());
        EXPECT_TRUE(outer.isAlive());
    }
    EXPECT_FALSE(lifeline.isWatched());
}

TEST(TYLifeline, WatchesOfTwoObjectsDoNotMix)
{
    auto first = std::make_unique<TYLifeline>();
    TYLifeline second;
    TYLifeline::Watch const watchOfFirst(*first);
    TYLifeline::Watch const watchOfSecond(second);
    first.reset();
    EXPECT_FALSE(watchOfFirst.isAlive());
    EXPECT_TRUE(watchOfSecond.isAlive());
    EXPECT_TRUE(second.isWatched());
}
