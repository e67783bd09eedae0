#include "configuration/WeekHours.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace
{
constexpr unsigned int HOUR = 60;
constexpr unsigned int DAY = 24 * HOUR;
} // namespace

TEST(WeekHours, AtFirstItIsAlways)
{
    for (unsigned int minute = 0; minute < 7 * DAY; ++minute)
        ASSERT_TRUE(WeekHours().contains(minute)) << minute;
    EXPECT_EQ(WeekHours::PARSE({}, {}), WeekHours());
    EXPECT_EQ(WeekHours::PARSE({}, "00:00-24:00"), WeekHours());
}

TEST(WeekHours, FromTheFirstMinuteToBeforeTheSecond)
{
    WeekHours const hours = WeekHours::PARSE({"mon", "wed"}, "08:00-18:30");
    EXPECT_FALSE(hours.contains(8 * HOUR - 1));
    EXPECT_TRUE(hours.contains(8 * HOUR));
    EXPECT_TRUE(hours.contains(18 * HOUR + 29));
    EXPECT_FALSE(hours.contains(18 * HOUR + 30));
    EXPECT_FALSE(hours.contains(DAY + 9 * HOUR));
    EXPECT_TRUE(hours.contains(2 * DAY + 9 * HOUR));
}

TEST(WeekHours, ANightBelongsToTheDayOnWhichItBegins)
{
    WeekHours const hours = WeekHours::PARSE({"sun"}, "22:00-06:00");
    EXPECT_FALSE(hours.contains(6 * DAY + 21 * HOUR));
    EXPECT_TRUE(hours.contains(6 * DAY + 22 * HOUR));
    EXPECT_TRUE(hours.contains(5 * HOUR)); // of Monday
    EXPECT_FALSE(hours.contains(6 * HOUR));
    EXPECT_FALSE(hours.contains(6 * DAY + 5 * HOUR)); // of Saturday's night
}

TEST(WeekHours, ADayWithoutHoursIsAllOfIt)
{
    WeekHours const hours = WeekHours::PARSE({"tue"}, {});
    EXPECT_FALSE(hours.contains(DAY - 1));
    EXPECT_TRUE(hours.contains(DAY));
    EXPECT_TRUE(hours.contains(2 * DAY - 1));
    EXPECT_FALSE(hours.contains(2 * DAY));
}

TEST(WeekHours, TheWeekBeginsWithMonday)
{
    std::tm monday{};
    monday.tm_year = 126;
    monday.tm_mon = 10;
    monday.tm_mday = 23; // 2026
    monday.tm_hour = 9;
    monday.tm_min = 5;
    monday.tm_isdst = -1;
    EXPECT_EQ(WeekHours::MINUTE_OF(std::mktime(&monday)), 9 * HOUR + 5);
    monday.tm_mday = 22; // the Sunday before
    monday.tm_isdst = -1;
    EXPECT_EQ(WeekHours::MINUTE_OF(std::mktime(&monday)), 6 * DAY + 9 * HOUR + 5);
}

TEST(WeekHours, WhatIsNoTimeIsRefused)
{
    for (char const* const hours :
         {"8-18", "08:00", "08:00-18:0a", "08:60-18:00", "24:01-25:00", "08.00-18.00", "08:00 18:00"})
        EXPECT_THROW(WeekHours::PARSE({}, hours), std::invalid_argument) << hours;
    EXPECT_THROW(WeekHours::PARSE({"monday"}, {}), std::invalid_argument);
}
