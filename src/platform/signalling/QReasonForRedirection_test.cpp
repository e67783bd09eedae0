#include "platform/signalling/QReasonForRedirection.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    QReasonForRedirection value;
    int number;
    char const* name;
};
// numbers are on the wire and names in configurations: neither may change
constexpr Case s_cases[] = {
    {QReasonForRedirection::UNSPECIFIED, -1, "Unspecified"},
    {QReasonForRedirection::UNKNOWN, 0, "Unknown"},
    {QReasonForRedirection::FORWARDING_BUSY, 1, "Call forwarding busy or called DTE busy"},
    {QReasonForRedirection::FORWARDING_NO_REPLY, 2, "Call forwarding no reply"},
    {QReasonForRedirection::CALL_DEFLECTION, 4, "Call deflection"},
    {QReasonForRedirection::OUT_OF_ORDER, 9, "Called DTE out of order"},
    {QReasonForRedirection::FORWARDING_BY_CALLED, 10, "Call forwarding by the called DTE"},
    {QReasonForRedirection::FORWARDING_UNCONDITIONAL, 15,
     "Call forwarding unconditional or systematic call redirection"},
};
} // namespace

TEST(QReasonForRedirection, EveryValueHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.value)) << row.name;
        EXPECT_STREQ(row.name, QREASON_FOR_REDIRECTION_NAME(row.value)) << row.number;
    }
}

TEST(QReasonForRedirection, AReservedOrForeignNumberIsInvalid)
{
    for (int const number : {-2, 3, 5, 8, 11, 14, 16})
        EXPECT_STREQ(ERROR::INVALID, QREASON_FOR_REDIRECTION_NAME(static_cast<QReasonForRedirection>(number)))
            << number;
}

TEST(QReasonForRedirection, TheDefaultIsTheValueZero)
{
    EXPECT_STREQ("Unknown", QREASON_FOR_REDIRECTION_NAME(QReasonForRedirection{}));
}
