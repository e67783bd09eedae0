#include "platform/signalling/QTypeOfNumber.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    QTypeOfNumber value;
    int number;
    char const* name;
};
// numbers are on the wire and names in configurations: neither may change
constexpr Case s_cases[] = {
    {QTypeOfNumber::UNKNOWN, 0, "Unknown"},
    {QTypeOfNumber::INTERNATIONAL, 1, "International number"},
    {QTypeOfNumber::NATIONAL, 2, "National number"},
    {QTypeOfNumber::NETWORK_SPECIFIC, 3, "Network specific number"},
    {QTypeOfNumber::SUBSCRIBER, 4, "Subscriber number"},
    {QTypeOfNumber::ABBREVIATED, 6, "Abbreviated number"},
    {QTypeOfNumber::RESERVED_FOR_EXTENSION, 7, "Reserved for extension"},
};
} // namespace

TEST(QTypeOfNumber, EveryValueHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.value)) << row.name;
        EXPECT_STREQ(row.name, QTYPE_OF_NUMBER_NAME(row.value)) << row.number;
    }
}

TEST(QTypeOfNumber, AnUnassignedOrForeignNumberIsInvalid)
{
    for (int const number : {-1, 5, 8, 16})
        EXPECT_STREQ(ERROR::INVALID, QTYPE_OF_NUMBER_NAME(static_cast<QTypeOfNumber>(number))) << number;
}

TEST(QTypeOfNumber, TheDefaultIsTheValueZero) { EXPECT_STREQ("Unknown", QTYPE_OF_NUMBER_NAME(QTypeOfNumber{})); }
