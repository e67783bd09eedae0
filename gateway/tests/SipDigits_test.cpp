#include "sip/message/SipDigits.h"

#include <gtest/gtest.h>

#include <ostream>

namespace
{
struct Row
{
    char const* type;
    char const* body;
    char const* digits; ///< null: none
    unsigned int duration;
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.type << ": " << row.body; }

class SipDigitsBody : public testing::TestWithParam<Row>
{
};
} // namespace

TEST_P(SipDigitsBody, IsRead)
{
    std::optional<SipDigits> const read = SipDigits::READ(GetParam().type, GetParam().body);
    ASSERT_EQ(read.has_value(), GetParam().digits != nullptr);
    if (!read)
        return;
    EXPECT_EQ(read->digits, GetParam().digits);
    EXPECT_EQ(read->duration, GetParam().duration);
}

INSTANTIATE_TEST_SUITE_P(
    SipDigits, SipDigitsBody,
    testing::Values(Row{"application/dtmf-relay", "Signal=5\r\nDuration=160\r\n", "5", 160},
                    Row{"Application/DTMF-Relay", "signal = #\nduration = 90", "#", 90},
                    Row{"application/dtmf-relay", "Duration=100\r\nSignal=b\r\n", "B", 100},
                    Row{"application/dtmf-relay", "Signal=10", "*", 0},
                    Row{"application/dtmf-relay", "Signal=16", "!", 0},
                    Row{"application/dtmf-relay", "Signal=1\r\nDuration=99999", "1", 0},
                    Row{"application/dtmf-relay", "Signal=17", nullptr, 0},
                    Row{"application/dtmf-relay", "Signal=", nullptr, 0}, Row{"application/dtmf-relay", "", nullptr, 0},
                    Row{"application/dtmf-relay", "5", nullptr, 0}, Row{"application/dtmf", "5", "5", 0},
                    Row{"application/dtmf", " 10\r\n", "10", 0}, Row{"application/dtmf", "1x", nullptr, 0},
                    Row{"application/dtmf", "", nullptr, 0}, Row{"text/plain", "5", nullptr, 0}));

TEST(SipDigits, WhatIsWrittenIsReadAgain)
{
    EXPECT_EQ(SipDigits::WRITE('#', 80), "Signal=#\r\nDuration=80\r\n");
    EXPECT_EQ(SipDigits::READ("application/dtmf-relay", SipDigits::WRITE('7', 0))->digits, "7");
}
