#include "services/CC_ServiceBlindTransfer.h"

#include "tests/support/ServiceTesting.h"

#include <gtest/gtest.h>

TEST(CC_ServiceBlindTransfer, PrintsCodeAndNumber)
{
    CC_ServiceBlindTransfer const service("*7", "49891234");
    EXPECT_EQ("Blind transfer (Code: *7 Number: 49891234)", LINE_OF(service));
    EXPECT_EQ("own Blind transfer\n  Code: *7\n  Number: 49891234\n", DUMP(service, 1, "own "));
    EXPECT_EQ("Blind transfer\n", DUMP(service, 0));
    EXPECT_STREQ("*7", service.getCode().c_str());
    EXPECT_STREQ("49891234", service.getNumber().c_str());
    EXPECT_LIMITS_KEPT(service);
    EXPECT_NO_THROW_WITHOUT_MEMORY(service);
}

TEST(CC_ServiceBlindTransfer, EmptyPartsArePrintedEmpty)
{
    CC_ServiceBlindTransfer const service("", "");
    EXPECT_EQ("Blind transfer (Code:  Number: )", LINE_OF(service));
    EXPECT_EQ("Blind transfer\n  Code\n  Number\n", DUMP(service, 1));
}
