#include "sip/message/SipQuality.h"

#include <gtest/gtest.h>

#include <ostream>
#include <string>

namespace
{
std::string SESSION(std::string const& media)
{
    return "v=0\r\no=- 1 1 IN IP4 192.0.2.1\r\ns=-\r\nc=IN IP4 192.0.2.1\r\nt=0 0\r\n" + media;
}

std::string const PCMA = SESSION("m=audio 4000 RTP/AVP 8\r\na=ptime:30\r\n");
std::string const G729 = SESSION("m=audio 4000 RTP/AVP 18\r\n");

struct Row
{
    char const* media;
    char const* codec; ///< null: no voice over RTP
    unsigned int period;
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.media; }

class SipQualityMedia : public testing::TestWithParam<Row>
{
};
} // namespace

TEST_P(SipQualityMedia, IsReadFromASessionDescription)
{
    auto const media = SipQuality::MEDIA_OF(SESSION(GetParam().media));
    ASSERT_EQ(media.has_value(), GetParam().codec != nullptr);
    if (!media)
        return;
    EXPECT_STREQ(MG_Rtp::ECodec::NAME(media->codec), GetParam().codec);
    EXPECT_EQ(media->packetPeriod, GetParam().period);
}

INSTANTIATE_TEST_SUITE_P(
    SipQuality, SipQualityMedia,
    testing::Values(
        Row{"m=audio 4000 RTP/AVP 8 0\r\na=ptime:20\r\n", "PCMA", 20}, Row{"m=audio 4000 RTP/AVP 0\r\n", "PCMU", 0},
        Row{"m=audio 4000 RTP/AVP 101 13 96\r\na=rtpmap:101 telephone-event/8000\r\na=rtpmap:96 OPUS/48000/2\r\n",
            "opus", 0},
        Row{"m=audio 4000 RTP/AVP 97\r\na=rtpmap:97 iLBC/8000\r\na=fmtp:97 mode=30\r\na=ptime: 30 \r\n", "iLBC", 30},
        Row{"m=audio 4000 RTP/AVP 6\r\n", "DVI4/16000", 0}, Row{"m=audio 4000 RTP/AVP 5\r\n", "DVI4/8000", 0},
        Row{"m=audio 4000 RTP/AVP 10\r\n", "L16/44100/2", 0}, Row{"m=audio 4000 RTP/AVP 11\r\n", "L16/44100", 0},
        Row{"m=audio 4000 RTP/AVP 98\r\na=rtpmap:98 G726-32/8000\r\n", "G726-32", 0},
        Row{"m=audio 4000 RTP/AVP 99\r\na=rtpmap:99 AMR/8000\r\n", "None", 0},
        Row{"m=audio 0 RTP/AVP 8\r\nm=audio 4002 RTP/AVP 0\r\na=ptime:0\r\n", "PCMU", 0},
        Row{"m=video 4000 RTP/AVP 31\r\n", nullptr, 0}, Row{"m=audio 0 RTP/AVP 8\r\n", nullptr, 0},
        Row{"m=audio 4000 RTP/AVP 101\r\na=rtpmap:101 telephone-event/8000\r\n", nullptr, 0},
        Row{"m=audio 4000/2 RTP/SAVP 18 8\r\n", "G729", 0}, Row{"m=audio 4000 RTP/AVP 127\r\n", "None", 0},
        Row{"m=audio 4000 RTP/AVP x\r\n", "None", 0}, Row{"m=audio 4000 RTP/AVP\r\n", nullptr, 0},
        Row{"m=audio 4000 udptl t38\r\n", nullptr, 0}, Row{"m=audio x y z\r\n", nullptr, 0},
        Row{"m=audio 4000 RT\x97/AVP 8 \"\r\n", nullptr, 0},
        Row{"m=video 1 RTP/AVP 31\r\na=ptime:10\r\nm=audio 4000 RTP/AVP 8\r\nm=audio 4002 RTP/AVP 0\r\na=ptime:20\r\n",
            "PCMA", 0},
        Row{"m=", nullptr, 0}, Row{"", nullptr, 0}));

TEST(SipQuality, WhatIsNoSessionDescriptionHasNoMedia)
{
    EXPECT_FALSE(SipQuality::MEDIA_OF(""));
    EXPECT_FALSE(SipQuality::MEDIA_OF("\""));
    EXPECT_FALSE(SipQuality::MEDIA_OF(std::string("v=0\0\r\n", 6)));
    EXPECT_FALSE(SipQuality::MEDIA_OF("m=audio 4000 RTP/AVP 8"));
}

TEST(SipQuality, ACodecBehindMoreCompanionsThanAnybodyHasIsNotSearchedFor)
{
    auto const behind = [](unsigned int companions)
    {
        std::string types;
        for (unsigned int i = 0; i < companions; ++i)
            types += "13 ";
        return SESSION("m=audio 4000 RTP/AVP " + types + "8\r\n");
    };
    EXPECT_TRUE(SipQuality::MEDIA_OF(behind(16)));
    EXPECT_FALSE(SipQuality::MEDIA_OF(behind(17)));
}

TEST(SipQuality, ACallWithoutAnAnswerHasNoRecord)
{
    SipQuality quality;
    EXPECT_FALSE(quality.getRecord(nullptr));
    quality.noteAnswer("");
    EXPECT_FALSE(quality.getRecord(nullptr));
}

TEST(SipQuality, ARecordTellsTheCodecAndNoFigureThatNobodyMeasured)
{
    SipQuality quality;
    quality.noteAnswer(PCMA);
    auto const record = quality.getRecord(nullptr);
    ASSERT_TRUE(record);
    CC_QoS::MediaInfo const& media = record->m_mediaInfo;
    ASSERT_TRUE(media.isSelected(media.m_rtp));
    ASSERT_TRUE(media.m_rtp.isPresent(media.m_rtp.m_config));
    EXPECT_EQ(media.m_rtp.m_config.m_mediaType.get(), (MG_Rtp::MediaType{MG_Rtp::ECodec::PCMA, 30}));
    EXPECT_EQ(media.m_rtp.m_codecChanges, 0);
    EXPECT_FALSE(media.m_rtp.isPresent(media.m_rtp.m_statistics));
    EXPECT_EQ(record->m_meanOpinionScore, 0);
    EXPECT_EQ(record->m_voiceQuality, 0);
}

TEST(SipQuality, AnotherCodecInALaterAnswerIsAChangeAndAnotherPeriodNone)
{
    SipQuality quality;
    std::string const shorter = SESSION("m=audio 4000 RTP/AVP 8\r\na=ptime:20\r\n");
    for (std::string const& answer : {PCMA, PCMA, shorter, G729, SESSION("m=audio 0 RTP/AVP 8\r\n"), G729, PCMA})
        quality.noteAnswer(answer);
    CC_QoS::MediaInfo::RTP const rtp = quality.getRecord(nullptr).value().m_mediaInfo.m_rtp;
    EXPECT_EQ(rtp.m_codecChanges, 2);
    EXPECT_EQ(rtp.m_config.m_mediaType.get().packetPeriod, 30u);
}

TEST(SipQuality, ACodecThatTheRecordCannotNameIsLeftOut)
{
    SipQuality quality;
    quality.noteAnswer(SESSION("m=audio 4000 RTP/AVP 99\r\na=rtpmap:99 AMR/8000\r\n"));
    auto const record = quality.getRecord(nullptr);
    ASSERT_TRUE(record);
    CC_QoS::MediaInfo::RTP const& rtp = record->m_mediaInfo.m_rtp;
    EXPECT_FALSE(rtp.isPresent(rtp.m_config));
}
