#include "services/CC_ServiceUserInputUpdate.h"

#include "services/CC_ServiceUserInput.h"
#include "tests/support/ServiceTesting.h"

#include <gtest/gtest.h>

// intended: a receiver that goes by type() treats an update as user input
TEST(CC_ServiceUserInputUpdate, ItsTypeIsThatOfUserInputButItIsNotOfIt)
{
    CC_ServiceUserInputUpdate const service(0);
    EXPECT_EQ(CC_ServiceUserInput::TYPE(), service.type());
    EXPECT_TRUE(service.isOfType(CC_ServiceUserInputUpdate::TYPE()));
    EXPECT_TRUE(service.isOfType(CC_Service::TYPE()));
    EXPECT_FALSE(service.isOfType(CC_ServiceUserInput::TYPE()));
    EXPECT_NE(CC_ServiceUserInput::TYPE(), CC_ServiceUserInputUpdate::TYPE());
}

// intended: the line has "Unknown" and no unit, the dump milliseconds also for 0
TEST(CC_ServiceUserInputUpdate, PrintsTheDuration)
{
    EXPECT_EQ("User Input Update (Duration: Unknown)", LINE_OF(CC_ServiceUserInputUpdate(0)));
    EXPECT_EQ("User Input Update\n  Duration: 0ms\n", DUMP(CC_ServiceUserInputUpdate(0), 1));
    CC_ServiceUserInputUpdate const service(4294967295U);
    EXPECT_EQ("User Input Update (Duration: 4294967295)", LINE_OF(service));
    EXPECT_EQ("own User Input Update\n  Duration: 4294967295ms\n", DUMP(service, 1, "own "));
    EXPECT_EQ("User Input Update\n", DUMP(service, 0));
    EXPECT_EQ(4294967295U, service.getDuration());
    EXPECT_LIMITS_KEPT(service);
    EXPECT_NO_THROW_WITHOUT_MEMORY(service);
}
