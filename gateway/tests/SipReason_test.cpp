#include "sip/message/SipReason.h"

#include <gtest/gtest.h>

#include <ostream>

namespace
{
struct Row
{
    char const* value;
    unsigned int q850Cause;
    unsigned int sipCode;
    char const* text;
};

class SipReasonValue : public testing::TestWithParam<Row>
{
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.value; }
} // namespace

TEST_P(SipReasonValue, IsRead)
{
    SipReason const reason = SipReason::PARSE(GetParam().value);
    EXPECT_EQ(reason.q850Cause, GetParam().q850Cause);
    EXPECT_EQ(reason.sipCode, GetParam().sipCode);
    EXPECT_EQ(reason.text, GetParam().text);
}

INSTANTIATE_TEST_SUITE_P(
    SipReason, SipReasonValue,
    testing::Values(Row{"Q.850;cause=17;text=\"User busy\"", 17, 0, "User busy"},
                    Row{"q.850 ; CAUSE = 17 ; Text=busy", 17, 0, "busy"},
                    Row{"SIP;cause=200;text=\"Call completed elsewhere\"", 0, 200, "Call completed elsewhere"},
                    Row{"SIP;cause=480, Q.850;cause=19;text=\"x\"", 19, 480, "x"},
                    Row{"Q.850;cause=19;text=\"first\", SIP;cause=480;text=\"second\"", 19, 480, "first"},
                    Row{"Q.850;cause=1, Q.850;cause=2", 1, 0, ""},
                    Row{"SIP;text=\"a, b; c=\\\"d\\\" \\\\\";cause=600", 0, 600, "a, b; c=\"d\" \\"},
                    Row{"X-Own;cause=99, Q.850;cause=16", 16, 0, ""}, Row{"Q.850;cause=0", 0, 0, ""},
                    Row{"Q.850;cause=128", 0, 0, ""}, Row{"Q.850;cause=17x", 0, 0, ""}, Row{"Q.850;cause=", 0, 0, ""},
                    Row{"Q.850;cause=-1", 0, 0, ""}, Row{"SIP;cause=99", 0, 0, ""}, Row{"SIP;cause=700", 0, 0, ""},
                    Row{"Q.850;text=\"no cause\"", 0, 0, ""}, Row{"Q.850", 0, 0, ""},
                    Row{"Q.850;cause=16;text=\"open", 16, 0, "\"open"}, Row{"Q.850;cause=16;text=\"", 16, 0, "\""},
                    Row{"Q.850;cause=16;text=\"\\", 16, 0, "\"\\"}, Row{",,;;==\"\"\",", 0, 0, ""}, Row{"", 0, 0, ""}));

TEST(SipReason, TextIsEscapedForTheInsideOfAQuotedString)
{
    EXPECT_EQ(SipReason::ESCAPE("User busy"), "User busy");
    EXPECT_EQ(SipReason::ESCAPE("say \"no\" \\ twice"), "say \\\"no\\\" \\\\ twice");
    EXPECT_EQ(SipReason::ESCAPE("a\r\nVia: b\x7f\x01"), "a  Via: b  ");
    EXPECT_EQ(SipReason::ESCAPE("\xc3\xa4"), "\xc3\xa4");
}

TEST(SipReason, WhatWasEscapedIsReadBack)
{
    std::string const text = "a \"b\", c; d \\";
    EXPECT_EQ(SipReason::PARSE("Q.850;cause=16;text=\"" + SipReason::ESCAPE(text) + "\"").text, text);
    EXPECT_EQ(SipReason::UNQUOTE("\"" + SipReason::ESCAPE(text) + "\""), text);
    EXPECT_EQ(SipReason::UNQUOTE("plain"), "plain");
    EXPECT_EQ(SipReason::UNQUOTE("\""), "\"");
}

TEST(SipReason, ControlCharactersAreReadAsBlanks)
{
    EXPECT_EQ(SipReason::UNQUOTE("\"a\r\n b\\\x1b\""), "a   b ");
    EXPECT_EQ(SipReason::UNQUOTE("a\r\n\x7f"
                                 "b"),
              "a   b");
}
