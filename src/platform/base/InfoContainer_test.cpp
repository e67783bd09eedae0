#include "platform/base/InfoContainer.h"

#include <gtest/gtest.h>

TEST(InfoContainer, AnEmptyDumpIsTheEmptyText)
{
    InfoContainer const info;
    EXPECT_EQ(0U, info.getNumberOfEntries());
    EXPECT_FALSE(info.isIncomplete());
    EXPECT_STREQ("", info.getString_TreeFormat().c_str());
}

TEST(InfoContainer, EveryLevelIsIndentedByTwoBlanks)
{
    InfoContainer info;
    info.add(0, 0, "Call", "17");
    info.add(1, 0, "State", "ALERTING");
    info.add(2, 1, "Leg", "a");
    info.add(1, 0, "Hops", "3");
    EXPECT_STREQ("Call: 17\n  State: ALERTING\n    Leg: a\n  Hops: 3\n", info.getString_TreeFormat().c_str());
}

TEST(InfoContainer, AHeadingHasNoText)
{
    InfoContainer info;
    info.add(0, 0, "Properties", "");
    EXPECT_STREQ("Properties\n", info.getString_TreeFormat().c_str());
}

TEST(InfoContainer, LevelsNeedNotBeContiguous)
{
    InfoContainer info;
    info.add(2, 0, "without a parent", "x");
    info.add(0, 0, "heading", "");
    info.add(3, 0, "far below it", "y");
    EXPECT_STREQ("    without a parent: x\nheading\n      far below it: y\n", info.getString_TreeFormat().c_str());
}

TEST(InfoContainer, FurtherLinesOfATextAreIndentedLikeChildren)
{
    InfoContainer info;
    info.add(1, 0, "text", "first\nsecond\n");
    EXPECT_STREQ("  text: first\n    second\n    \n", info.getString_TreeFormat().c_str());
}

TEST(InfoContainer, AnEntryKeepsWhatWasAdded)
{
    InfoContainer info;
    info.add(4, 5, "key", "text");
    ASSERT_EQ(1U, info.getNumberOfEntries());
    EXPECT_EQ(4U, info.getEntry(0).level);
    EXPECT_EQ(5U, info.getEntry(0).detail);
    EXPECT_STREQ("key", info.getEntry(0).key.c_str());
    EXPECT_STREQ("text", info.getEntry(0).text.c_str());
}

TEST(InfoContainer, TextIsNeverTakenForAFormat)
{
    InfoContainer info;
    info.add(0, 0, "%s", "100 %n");
    EXPECT_STREQ("%s: 100 %n\n", info.getString_TreeFormat().c_str());
}

TEST(InfoContainer, AddingWithinLimitsJoinsPrefixAndLabel)
{
    InfoContainer info;
    info.addWithin(2, 1, 3, 0, "Own ", "State", "CONNECTED");
    ASSERT_EQ(1U, info.getNumberOfEntries());
    EXPECT_STREQ("Own State", info.getEntry(0).key.c_str());
    EXPECT_EQ(1U, info.getEntry(0).level);
    EXPECT_EQ(0U, info.getEntry(0).detail);
}

TEST(InfoContainer, WhatLiesAtALimitIsAddedAndWhatLiesBeyondIsNot)
{
    struct Case
    {
        unsigned int maxLevel, level, maxDetail, detail;
        unsigned int added;
    };
    for (Case const& row :
         {Case{1, 1, 2, 2, 1}, Case{0, 1, 2, 2, 0}, Case{1, 1, 1, 2, 0}, Case{0, 0, 0, 0, 1}, Case{0, 1, 0, 1, 0}})
    {
        InfoContainer info;
        info.addWithin(row.maxLevel, row.level, row.maxDetail, row.detail, "", "key", "text");
        EXPECT_EQ(row.added, info.getNumberOfEntries())
            << row.maxLevel << ' ' << row.level << ' ' << row.maxDetail << ' ' << row.detail;
    }
}
