#include "host/FreeMemory.h"

#include <gtest/gtest.h>

namespace
{
constexpr long long MILLISECOND = 1000000; // nanoseconds
} // namespace

TEST(FreeMemory, ALookThatCostsLittleIsRepeatedEveryFiveSeconds)
{
    EXPECT_EQ(FreeMemory::PAUSE_AFTER(0), 5000u);
    EXPECT_EQ(FreeMemory::PAUSE_AFTER(5 * MILLISECOND), 5000u);
}

TEST(FreeMemory, ALookOverMuchWaitsUntilItIsAThousandthOfTheTime)
{
    EXPECT_EQ(FreeMemory::PAUSE_AFTER(70 * MILLISECOND), 70000u);
}

TEST(FreeMemory, NoLookWaitsForLongerThanTenMinutes)
{
    EXPECT_EQ(FreeMemory::PAUSE_AFTER(60000 * MILLISECOND), 600000u);
}
