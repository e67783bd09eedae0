#include "platform/signalling/QNumberingPlan.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    QNumberingPlan value;
    int number;
    char const* name;
};
// numbers are on the wire and names in configurations: neither may change
constexpr Case s_cases[] = {
    {QNumberingPlan::UNKNOWN, 0, "Unknown"},
    {QNumberingPlan::ISDN, 1, "ISDN/telephony numbering plan (Recommendation E.164)"},
    {QNumberingPlan::DATA, 3, "Data numbering plan (Recommendation X.121)"},
    {QNumberingPlan::TELEX, 4, "Telex numbering plan (Recommendation F.69)"},
    {QNumberingPlan::NATIONAL_STANDARD, 8, "National standard numbering plan"},
    {QNumberingPlan::PRIVATE, 9, "Private numbering plan"},
    {QNumberingPlan::RESERVED_FOR_EXTENSION, 15, "Reserved for extension"},
};
} // namespace

TEST(QNumberingPlan, EveryValueHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.value)) << row.name;
        EXPECT_STREQ(row.name, QNUMBERING_PLAN_NAME(row.value)) << row.number;
    }
}

TEST(QNumberingPlan, AReservedOrForeignNumberIsInvalid)
{
    for (int const number : {-1, 2, 5, 6, 7, 10, 14, 16})
        EXPECT_STREQ(ERROR::INVALID, QNUMBERING_PLAN_NAME(static_cast<QNumberingPlan>(number))) << number;
}

TEST(QNumberingPlan, TheDefaultIsTheValueZero) { EXPECT_STREQ("Unknown", QNUMBERING_PLAN_NAME(QNumberingPlan{})); }
