#include "platform/signalling/QPresentationIndicator.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    QPresentationIndicator value;
    int number;
    char const* name;
};
// numbers are on the wire and names in configurations: neither may change
constexpr Case s_cases[] = {
    {QPresentationIndicator::ALLOWED, 0, "Presentation allowed"},
    {QPresentationIndicator::RESTRICTED, 1, "Presentation restricted"},
    {QPresentationIndicator::NOT_AVAILABLE, 2, "Number not available due to interworking"},
    {QPresentationIndicator::RESERVED, 3, "Reserved"},
};
} // namespace

TEST(QPresentationIndicator, EveryValueHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.value)) << row.name;
        EXPECT_STREQ(row.name, QPRESENTATION_INDICATOR_NAME(row.value)) << row.number;
    }
}

TEST(QPresentationIndicator, AValueAsItStandsInItsOctetIsInvalid)
{
    for (int const number : {-1, 4, 32, 64})
        EXPECT_STREQ(ERROR::INVALID, QPRESENTATION_INDICATOR_NAME(static_cast<QPresentationIndicator>(number)))
            << number;
}

TEST(QPresentationIndicator, TheDefaultIsTheValueZero)
{
    EXPECT_STREQ("Presentation allowed", QPRESENTATION_INDICATOR_NAME(QPresentationIndicator{}));
}
