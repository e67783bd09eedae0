#include "services/CC_ServiceUserInput.h"

#include "tests/support/ServiceTesting.h"

#include <gtest/gtest.h>

// intended: the line has "Unknown" and no unit, the dump milliseconds also for 0
TEST(CC_ServiceUserInput, AnUnknownDurationIsNamedInTheLineAndZeroInTheDump)
{
    CC_ServiceUserInput const service("12");
    EXPECT_EQ("User Input: 12 (Duration: Unknown)", LINE_OF(service));
    EXPECT_EQ("User Input: 12\n  Duration: 0ms\n", DUMP(service, 1));
    EXPECT_EQ(0U, service.getDuration());
}

TEST(CC_ServiceUserInput, AKnownDurationHasItsUnitInTheDumpOnly)
{
    CC_ServiceUserInput const service("12", 250);
    EXPECT_EQ("User Input: 12 (Duration: 250)", LINE_OF(service));
    EXPECT_EQ("own User Input: 12\n  Duration: 250ms\n", DUMP(service, 1, "own "));
    EXPECT_EQ("User Input: 12\n", DUMP(service, 0));
    EXPECT_STREQ("12", service.getInput().c_str());
    EXPECT_EQ(250U, service.getDuration());
    EXPECT_EQ(CC_ServiceUserInput::TYPE(), service.type());
    EXPECT_LIMITS_KEPT(service);
    EXPECT_NO_THROW_WITHOUT_MEMORY(service);
}
