#include "sip/dialog/SipDescription.h"

#include <gtest/gtest.h>

#include <ostream>
#include <string>

namespace
{
std::string SESSION(std::string const& media, std::string const& address = "192.0.2.1")
{
    return "v=0\r\no=- 1 1 IN IP4 192.0.2.1\r\ns=-\r\nc=IN IP4 " + address + "\r\nt=0 0\r\n" + media;
}

struct Row
{
    std::string description;
    bool isHold;
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.description; }

class SipDescriptionHold : public testing::TestWithParam<Row>
{
};
} // namespace

TEST_P(SipDescriptionHold, IsToldFromListening)
{
    EXPECT_EQ(SipDescription::IS_HOLD(GetParam().description), GetParam().isHold);
}

INSTANTIATE_TEST_SUITE_P(
    SipDescription, SipDescriptionHold,
    testing::Values(Row{SESSION("m=audio 4000 RTP/AVP 8\r\n"), false},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\na=sendrecv\r\n"), false},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\na=recvonly\r\n"), false},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\na=sendonly\r\n"), true},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\na=inactive\r\n"), true},
                    Row{SESSION("a=sendonly\r\nm=audio 4000 RTP/AVP 8\r\n"), true},
                    Row{SESSION("a=sendonly\r\nm=audio 4000 RTP/AVP 8\r\na=sendrecv\r\n"), false},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\n", "0.0.0.0"), true},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\nc=IN IP4 192.0.2.2\r\n", "0.0.0.0"), false},
                    Row{SESSION("m=audio 4000 RTP/AVP 8\r\na=inactive\r\nm=audio 4002 RTP/AVP 8\r\n"), false},
                    Row{SESSION("m=video 4000 RTP/AVP 31\r\na=inactive\r\nm=audio 4002 RTP/AVP 8\r\n"), false},
                    Row{SESSION("m=audio 0 RTP/AVP 8\r\na=inactive\r\n"), false}, // refused is not held
                    Row{SESSION("m=video 4000 RTP/AVP 31\r\na=inactive\r\n"), false}, Row{SESSION(""), false},
                    Row{"", false}, Row{"m=", false}));

TEST(SipDescription, WhatTheParserWouldNeverComeBackFromIsNotReadable)
{
    EXPECT_TRUE(SipDescription::IS_READABLE(SESSION("m=audio 4000 RTP/AVP 8 0 101\r\n")));
    EXPECT_TRUE(SipDescription::IS_READABLE(SESSION("m=image 4000 udptl t38\r\n")));
    EXPECT_FALSE(SipDescription::IS_READABLE(SESSION("m=audio 4000 RT\x97/AVP 8 \"\r\n")));
    EXPECT_FALSE(SipDescription::IS_READABLE(SESSION("m=audio 4000 udptl t38 \"\r\n")));
    EXPECT_FALSE(SipDescription::IS_READABLE(SESSION("m=audio 4000 udptl \x97\r\n")));
    EXPECT_FALSE(SipDescription::IS_READABLE(SESSION("m=audio 4000 udptl (\n")));
    EXPECT_FALSE(SipDescription::IS_READABLE(std::string("v=0\0\r\n", 6)));
}

TEST(SipDescription, ARefusalHasEachStreamOfTheOfferWithoutAPort)
{
    std::string const refusal = SipDescription::REFUSING(
        SESSION("m=audio 4000 RTP/AVP 8\r\na=rtpmap:8 PCMA/8000\r\nm=video 4002 RTP/AVP 31\r\n"));
    EXPECT_NE(refusal.find("m=audio 0 RTP/AVP 8\r\n"), std::string::npos) << refusal;
    EXPECT_NE(refusal.find("m=video 0 RTP/AVP 31\r\n"), std::string::npos) << refusal;
    EXPECT_EQ(SipDescription::REFUSING("nonsense"), "");
}
