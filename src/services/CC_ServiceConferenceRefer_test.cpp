#include "services/CC_ServiceConferenceRefer.h"

#include "tests/support/ServiceTesting.h"

#include <gtest/gtest.h>

TEST(CC_ServiceConferenceRefer, PrintsWhereTheConferenceIs)
{
    CC_ServiceConferenceRefer const service("sip:room@gw");
    EXPECT_EQ("Conference refer: sip:room@gw", LINE_OF(service));
    EXPECT_EQ("own Conference refer\n  Refer-to: sip:room@gw\n", DUMP(service, 1, "own "));
    EXPECT_EQ("Conference refer\n", DUMP(service, 0));
    EXPECT_STREQ("sip:room@gw", service.getReferTo().c_str());
    EXPECT_LIMITS_KEPT(service);
    EXPECT_NO_THROW_WITHOUT_MEMORY(service);
}
