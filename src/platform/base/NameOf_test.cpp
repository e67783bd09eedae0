#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
constexpr NamedValue<int> s_table[] = {{-1, "minus one"}, {0, "zero"}, {7, "seven"}, {7, "another seven"}};
}

TEST(NameOf, AValueOfTheTableHasTheNameOfItsFirstRow)
{
    EXPECT_STREQ("minus one", NAME_OF(s_table, -1));
    EXPECT_STREQ("zero", NAME_OF(s_table, 0));
    EXPECT_STREQ("seven", NAME_OF(s_table, 7));
}

TEST(NameOf, AnyOtherValueIsInvalidOrHasTheNameAskedFor)
{
    EXPECT_STREQ(ERROR::INVALID, NAME_OF(s_table, 1));
    EXPECT_STREQ("other", NAME_OF(s_table, 1, "other"));
    EXPECT_EQ(nullptr, NAME_OF(s_table, 1, nullptr));
}
