#include "platform/base/XCode.h"

#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>
#include <sstream>

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

TEST(XCode, AResultSaysItsName)
{
    EXPECT_STREQ("OK", XCode().getName());
    EXPECT_STREQ("NO_ELEMENT", XCode::NO_ELEMENT.getName());
    EXPECT_STREQ("ABSENT", XCode::ABSENT.getName());
    EXPECT_STREQ("REFUSED", XCode::REFUSED.getName());
    EXPECT_STREQ("FAILURE", XCode::NAME(XCode(0x7fffffff)));
    EXPECT_STREQ(ERROR::INVALID, XCode(5).getName());
    static_assert(XCode::REFUSED.getName()[0] == 'R');
}

TEST(XCode, AStreamShowsNameOrNumber)
{
    std::ostringstream stream;
    stream << XCode::ABSENT << ", " << XCode(5);
    EXPECT_EQ("ABSENT, (invalid) 5", stream.str());
}

TEST(XCode, AFailingTestShowsTheNames)
{
    EXPECT_NONFATAL_FAILURE(EXPECT_EQ(XCode::OK, XCode::REFUSED), "Which is: REFUSED");
}
