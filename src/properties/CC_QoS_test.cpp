#include "properties/CC_QoS.h"

#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>
#include <utility>

namespace
{
using RTP = CC_QoS::MediaInfo::RTP;

CC_QoS WITH_STATISTICS()
{
    CC_QoS qos;
    RTP& rtp = qos.m_mediaInfo.select(qos.m_mediaInfo.m_rtp);
    rtp.setPresent(rtp.m_config).m_mediaType.set({MG_Rtp::ECodec::G729, 30});
    rtp.setPresent(rtp.m_statistics).setPresent(rtp.m_statistics.m_remote).m_rxJitter = 9;
    return qos;
}
} // namespace

TEST(CC_QoS, NoMediaIsSelectedAtFirst)
{
    CC_QoS const qos;
    EXPECT_EQ(0, qos.m_voiceQuality);
    EXPECT_EQ(0, qos.m_meanOpinionScore);
    EXPECT_EQ("REFUSED CC-QoS.mediaInfo: no alternative is selected", HEX(qos));
}

TEST(CC_QoS, TheMediaTypeIsTheGateways)
{
    RTP::RtpCfg config;
    EXPECT_EQ((MG_Rtp::MediaType{MG_Rtp::ECodec::PCMU, 0}), config.m_mediaType.get());
    for (MG_Rtp::MediaType const media : {MG_Rtp::MediaType{MG_Rtp::ECodec::PCMA, 20}, MG_Rtp::MediaType{},
                                          MG_Rtp::MediaType{MG_Rtp::ECodec::OPUS, 4294967295U}})
    {
        config.m_mediaType.set(media);
        RTP::RtpCfg decoded;
        EXPECT_EQ("", DECODE(decoded, HEX(config)));
        EXPECT_EQ(media, decoded.m_mediaType.get());
    }
}

TEST(CC_QoS, OptionalPartsAreOptional)
{
    RTP rtp;
    EXPECT_FALSE(rtp.isPresent(rtp.m_config));
    EXPECT_FALSE(rtp.isPresent(rtp.m_statistics));
    EXPECT_EQ("3003810100", HEX(rtp));
    rtp.setPresent(rtp.m_statistics);
    EXPECT_EQ("3005810100A300", HEX(rtp));
    EXPECT_FALSE(rtp.m_statistics.isPresent(rtp.m_statistics.m_local));
}

TEST(CC_QoS, CopiesAreEqualAndIndependent)
{
    CC_QoS const qos = WITH_STATISTICS();
    CC_QoS copy(qos);
    EXPECT_TRUE(copy == qos);
    copy.m_mediaInfo.m_rtp.m_statistics.m_remote.m_rxJitter = 10;
    EXPECT_FALSE(copy == qos);
    EXPECT_EQ(9, qos.m_mediaInfo.m_rtp.m_statistics.m_remote.m_rxJitter);
    copy = qos;
    EXPECT_TRUE(copy == qos);
    std::unique_ptr<AsnSyntax> const clone(qos.clone());
    EXPECT_TRUE(clone->isEqual(qos));
    copy.m_mediaInfo.m_rtp.setAbsent(copy.m_mediaInfo.m_rtp.m_config);
    EXPECT_FALSE(copy == qos);
    copy.m_mediaInfo.select(copy.m_mediaInfo.m_ds0);
    EXPECT_FALSE(copy == qos);
}

TEST(CC_QoS, AnErrorNamesThePlaceInTheRecord)
{
    CC_QoS qos = WITH_STATISTICS();
    EXPECT_EQ("CC-QoS.mediaInfo.rtp.statistics.local.rxOctets: is missing, octet 22",
              DECODE(qos, "3014 810100 820100 A30C A10A 810100 A305 A103 810101"));
    EXPECT_EQ("CC-QoS.mediaInfo: is missing, octet 8", DECODE(qos, "3006810100820100"));
}
