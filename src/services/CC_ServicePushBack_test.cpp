#include "services/CC_ServicePushBack.h"

#include "tests/support/ServiceTesting.h"

#include <gtest/gtest.h>

TEST(CC_ServicePushBack, PrintsTheLegsId)
{
    CC_ServicePushBack const service(5);
    EXPECT_EQ("Push Back: 5", LINE_OF(service));
    EXPECT_EQ("own Push Back: 5\n", DUMP(service, 9, "own "));
    EXPECT_EQ(5U, service.getCallLegId());
    EXPECT_LIMITS_KEPT(service);
}

TEST(CC_ServicePushBack, TheIdHas64Bits)
{
    CC_ServicePushBack const service(~0ULL);
    EXPECT_EQ("Push Back: 18446744073709551615", LINE_OF(service));
    EXPECT_EQ("Push Back: 18446744073709551615\n", DUMP(service, 9));
    EXPECT_NO_THROW_WITHOUT_MEMORY(service);
}
