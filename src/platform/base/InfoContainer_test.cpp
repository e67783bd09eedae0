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

TEST(InfoContainer, TextsBeginInTheColumnOfTheKeyWidth)
{
    InfoContainer info;
    info.add(0, 0, "Local", "");
    info.add(1, 0, "Jitter", "12 ms");
    info.add(1, 0, "Ten letter", "at the column");
    info.add(1, 0, "Eleven let.", "past it\nand on");
    String text("left from before");
    EXPECT_EQ(&text, &info.getString_TreeFormat(text, 14, 0, 0));
    EXPECT_STREQ("Local\n  Jitter:     12 ms\n  Ten letter: at the column\n  Eleven let.: past it\n    and on\n",
                 text.c_str());
}

TEST(InfoContainer, AMarginStandsBeforeEveryLine)
{
    InfoContainer info;
    info.add(0, 0, "a", "1\n2");
    info.add(1, 0, "b", "3");
    String text;
    EXPECT_STREQ("   a:  1\n     2\n     b: 3\n", info.getString_TreeFormat(text, 4, 3, 0).c_str());
}

TEST(InfoContainer, TheBaseLevelStandsAtTheMargin)
{
    InfoContainer info;
    info.add(1, 0, "above", "1");
    info.add(2, 0, "base", "2");
    info.add(3, 0, "below", "3");
    String text;
    EXPECT_STREQ("above: 1\nbase: 2\n  below: 3\n", info.getString_TreeFormat(text, 0, 0, 2).c_str());
}

TEST(InfoContainer, WithoutSettingsBothFormsAreTheSame)
{
    InfoContainer info;
    info.add(1, 0, "key", "text\nmore");
    info.add(0, 0, "heading", "");
    info.markIncomplete();
    String text;
    EXPECT_TRUE(info.getString_TreeFormat() == info.getString_TreeFormat(text, 0, 0, 0));
    EXPECT_STREQ("  key: text\n    more\nheading\n(incomplete: memory ran out)\n", text.c_str());
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

TEST(InfoContainer, ANulOctetIsRenderedLikeAnyOther)
{
    InfoContainer info;
    info.add(0, 0, String("k\0y", 3), String("a\0b", 3));
    EXPECT_EQ(String("k\0y: a\0b\n", 9), info.getString_TreeFormat());
}
