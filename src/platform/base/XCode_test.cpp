#include "platform/base/XCode.h"

#include <gtest/gtest.h>

TEST(XCode, TheNamedResultsHaveTheirNumbers)
{
    EXPECT_EQ(0U, XCode::OK.getValue());
    EXPECT_EQ(0x40000001U, XCode::NO_ELEMENT.getValue());
    EXPECT_EQ(0x40000003U, XCode::ABSENT.getValue());
    EXPECT_EQ(0x40000004U, XCode::REFUSED.getValue());
    EXPECT_EQ(0x7fffffffU, XCode::FAILURE.getValue());
}

TEST(XCode, OnlyZeroIsSuccess)
{
    EXPECT_TRUE(XCode().isOk());
    EXPECT_TRUE(XCode::OK.isOk());
    for (XCode const result : {XCode::NO_ELEMENT, XCode::ABSENT, XCode::REFUSED, XCode::FAILURE, XCode(1)})
        EXPECT_FALSE(result.isOk()) << result.getValue();
}

TEST(XCode, ResultsOfOneNumberAreEqual)
{
    EXPECT_EQ(XCode(0x40000004), XCode::REFUSED);
    EXPECT_FALSE(XCode::REFUSED == XCode::ABSENT);
}
