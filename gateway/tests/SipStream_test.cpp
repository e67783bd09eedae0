#include "sip/dialog/SipStream.h"

#include <gtest/gtest.h>

#include <string>

namespace
{
std::string SESSION(std::string const& media, std::string const& attributes = {})
{
    return "v=0\r\no=them 7 8 IN IP4 192.0.2.1\r\ns=-\r\nc=IN IP4 192.0.2.1\r\nt=0 0\r\n" + attributes + media;
}

SipStream::Origin const OURS{MediaAddress::OF("198.51.100.9", 30000), 4711, 2};

std::string REWRITTEN(std::string const& media, std::string const& attributes = {})
{
    return SipStream::WITH_ADDRESS(SESSION(media, attributes), OURS);
}

bool HAS(std::string const& text, std::string const& line) { return text.find(line + "\r\n") != std::string::npos; }
} // namespace

TEST(SipStreamWithAddress, ComesFromUsAndGoesToUs)
{
    std::string const text = REWRITTEN("m=audio 4000 RTP/AVP 8 101\r\na=rtpmap:8 PCMA/8000\r\n"
                                       "a=rtpmap:101 telephone-event/8000\r\na=fmtp:101 0-15\r\na=ptime:30\r\n");
    EXPECT_TRUE(HAS(text, "o=gateway 4711 2 IN IP4 198.51.100.9")) << text;
    EXPECT_TRUE(HAS(text, "c=IN IP4 198.51.100.9")) << text;
    EXPECT_TRUE(HAS(text, "m=audio 30000 RTP/AVP 8 101")) << text;
    EXPECT_TRUE(HAS(text, "a=fmtp:101 0-15")) << text;
    EXPECT_TRUE(HAS(text, "a=ptime:30")) << text;
    EXPECT_EQ(text.find("192.0.2.1"), std::string::npos) << text;
}

TEST(SipStreamWithAddress, KeepsTheDirection)
{
    for (char const* const direction : {"sendonly", "recvonly", "inactive"})
    {
        std::string const line = std::string("a=") + direction;
        EXPECT_TRUE(HAS(REWRITTEN("m=audio 4000 RTP/AVP 8\r\n" + line + "\r\n"), line));
        EXPECT_TRUE(HAS(REWRITTEN("m=audio 4000 RTP/AVP 8\r\n", line + "\r\n"), line)) << "of the session";
    }
}

TEST(SipStreamWithAddress, LeavesOutWhatWouldLeadPastUs)
{
    std::string const text =
        REWRITTEN("m=audio 4000 RTP/AVP 8 77\r\nc=IN IP4 192.0.2.2\r\na=rtpmap:77 X-UNHEARD/8000\r\na=rtcp:4999\r\n"
                  "a=candidate:1 1 UDP 1 192.0.2.3 4000 typ host\r\na=rtcp-mux\r\n",
                  "a=ice-ufrag:abcd\r\n");
    for (char const* const gone : {"192.0.2.2", "UNHEARD", "rtcp", "candidate", "ice"})
        EXPECT_EQ(text.find(gone), std::string::npos) << gone << "\n" << text;
    EXPECT_TRUE(HAS(text, "m=audio 30000 RTP/AVP 8")) << text;
}

TEST(SipStreamWithAddress, RefusesEveryOtherStream)
{
    std::string const text = REWRITTEN(
        "m=video 5000 RTP/AVP 31\r\nm=audio 4000 RTP/SAVP 8\r\nm=audio 4002 RTP/AVP 0\r\nm=audio 4004 RTP/AVP 0\r\n");
    EXPECT_NE(text.find("m=video 0 "), std::string::npos) << text;
    EXPECT_NE(text.find("m=audio 0 RTP/SAVP"), std::string::npos) << text;
    EXPECT_TRUE(HAS(text, "m=audio 30000 RTP/AVP 0")) << text;
    EXPECT_TRUE(HAS(text, "m=audio 0 RTP/AVP 0")) << text;
}

TEST(SipStreamWithAddress, OfAStreamWithoutACodecThatWeKnowItIsRefused)
{
    EXPECT_EQ(REWRITTEN("m=audio 4000 RTP/AVP 77\r\na=rtpmap:77 X-UNHEARD/8000\r\n").find("m=audio 30000"),
              std::string::npos);
}

TEST(SipStreamWithAddress, WhatCannotBeReadIsNothing) { EXPECT_EQ(SipStream::WITH_ADDRESS("v=1\r\n", OURS), ""); }

TEST(SipStreamAgreed, HasTheFormatsOfBothInTheFarSidesOrderWithTheNumbersOfEach)
{
    auto const agreed = SipStream::AGREED(
        SESSION(
            "m=audio 30000 RTP/AVP 8 0 96 101\r\na=rtpmap:96 opus/48000/2\r\na=rtpmap:101 telephone-event/8000\r\n"),
        SESSION("m=audio 4000 RTP/AVP 111 8 100\r\na=rtpmap:111 opus/48000/2\r\na=rtpmap:100 telephone-event/8000\r\n"
                "a=ptime:40\r\n"));
    ASSERT_TRUE(agreed.has_value());
    EXPECT_EQ(agreed->rtp, MediaAddress::OF("192.0.2.1", 4000));
    ASSERT_EQ(agreed->formats.getSize(), 2u);
    MediaFormat const& first = *agreed->formats.begin();
    EXPECT_EQ(first.codec, VoipCodec(MG_Rtp::ECodec::OPUS, 40));
    EXPECT_EQ(first.types, (MediaPayloadTypes{96, 111}));
    EXPECT_EQ(agreed->formats.find(MG_Rtp::ECodec::PCMA)->types, (MediaPayloadTypes{8, 8}));
    EXPECT_EQ(agreed->telephoneEvent, (MediaPayloadTypes{101, 100}));
    EXPECT_EQ(agreed->mode, VoipCodecAndMode::SEND_RECEIVE);
}

TEST(SipStreamAgreed, FlowsWhereBothWantItTo)
{
    auto const modeOf = [](std::string const& ours, std::string const& far)
    {
        return SipStream::AGREED(SESSION("m=audio 30000 RTP/AVP 8\r\na=" + ours + "\r\n"),
                                 SESSION("m=audio 4000 RTP/AVP 8\r\na=" + far + "\r\n"))
            ->mode;
    };
    EXPECT_EQ(modeOf("sendrecv", "sendrecv"), VoipCodecAndMode::SEND_RECEIVE);
    EXPECT_EQ(modeOf("sendonly", "recvonly"), VoipCodecAndMode::SEND_ONLY);
    EXPECT_EQ(modeOf("recvonly", "sendonly"), VoipCodecAndMode::RECEIVE_ONLY);
    EXPECT_EQ(modeOf("sendrecv", "inactive"), VoipCodecAndMode::INACTIVE);
    EXPECT_EQ(modeOf("inactive", "sendrecv"), VoipCodecAndMode::INACTIVE);
}

TEST(SipStreamAgreed, NeedsAStreamThatBothHave)
{
    std::string const voice = SESSION("m=audio 30000 RTP/AVP 8\r\n");
    EXPECT_FALSE(SipStream::AGREED(voice, SESSION("m=audio 0 RTP/AVP 8\r\n")).has_value());
    EXPECT_FALSE(SipStream::AGREED(voice, SESSION("m=video 4000 RTP/AVP 31\r\n")).has_value());
    EXPECT_FALSE(SipStream::AGREED(voice, "nonsense").has_value());
}
