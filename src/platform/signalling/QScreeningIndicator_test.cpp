#include "platform/signalling/QScreeningIndicator.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    QScreeningIndicator value;
    int number;
    char const* name;
};
// numbers are on the wire and names in configurations: neither may change
constexpr Case s_cases[] = {
    {QScreeningIndicator::USER_PROVIDED_NOT_SCREENED, 0, "User-provided, not screened"},
    {QScreeningIndicator::USER_PROVIDED_PASSED, 1, "User-provided, verified and passed"},
    {QScreeningIndicator::USER_PROVIDED_FAILED, 2, "User-provided, verified and failed"},
    {QScreeningIndicator::NETWORK_PROVIDED, 3, "Network provided"},
};
} // namespace

TEST(QScreeningIndicator, EveryValueHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.value)) << row.name;
        EXPECT_STREQ(row.name, QSCREENING_INDICATOR_NAME(row.value)) << row.number;
    }
}

TEST(QScreeningIndicator, AForeignNumberIsInvalid)
{
    for (int const number : {-1, 4, 100})
        EXPECT_STREQ(ERROR::INVALID, QSCREENING_INDICATOR_NAME(static_cast<QScreeningIndicator>(number))) << number;
}

TEST(QScreeningIndicator, TheDefaultIsTheValueZero)
{
    EXPECT_STREQ("User-provided, not screened", QSCREENING_INDICATOR_NAME(QScreeningIndicator{}));
}
