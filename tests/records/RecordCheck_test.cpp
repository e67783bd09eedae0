#include "RecordCheck.h"

#include <gtest/gtest.h>
#include <sstream>

namespace
{
struct Case
{
    char const* line;
    char const* failure;
};

Case const s_cases[] = {
    {"n | Charge ::= freeOfCharge : NULL | 8200", ""},
    {"n|Charge::=freeOfCharge : NULL|8200", ""},
    {"n | Currency ::= \"a|b\" | 1603617C62", ""},
    {"n | Charge ::= freeOfCharge : NULL", "is not \"name | Type ::= value | DER\""},
    {"n | Charge freeOfCharge : NULL | 8200", "is not \"name | Type ::= value | DER\""},
    {"n | Price ::= 1 | 020101", "there is no type \"Price\""},
    {"n | Charge ::= freeOfCharge : NULL | 820", "the octets are not hexadecimal"},
    {"n | Charge ::= freeOfCharge : NULL | 8201", "does not decode: Charge: the length 1 runs past the end, octet 1"},
    {"n | Charge ::= freeOfCharge : NULL | 8100", "decodes to chargeNotAvailable : NULL"},
    {"n | CurrencyAmount ::= 1 | 02020001", "what is decoded encodes to 020101"},
};
} // namespace

TEST(RecordCheck, SaysWhyALineFails)
{
    for (Case const& row : s_cases)
        EXPECT_EQ(row.failure, RecordCheck::FAILURE_OF(row.line)) << row.line;
}

TEST(RecordCheck, PassesOverCommentsAndCountsTheRest)
{
    std::istringstream lines("# c | Charge ::= x | 00\n\n  \na | Charge ::= freeOfCharge : NULL | 8200\n"
                             "b | Charge ::= freeOfCharge : NULL | 8100\n");
    std::ostringstream out;
    RecordCheck check(out);
    check.run(lines);
    EXPECT_EQ("b: decodes to chargeNotAvailable : NULL\n1 passed, 1 failed\n", out.str());
    EXPECT_EQ(1U, check.getNumberOfPasses());
    EXPECT_EQ(1U, check.getNumberOfFailures());
}
