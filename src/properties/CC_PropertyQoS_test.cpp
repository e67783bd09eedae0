#include "properties/CC_PropertyQoS.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace
{
using RTP = CC_QoS::MediaInfo::RTP;
using Stat = RTP::RtpStat::Stat;

constexpr unsigned int ALL = 0xffffffff;

CC_QoS SCORED(int score)
{
    CC_QoS qos;
    qos.m_meanOpinionScore = score;
    return qos;
}

void COUNT(Stat& stat, int first)
{
    int number = first;
    for (AsnInteger* const counter : {&stat.m_rxPackets, &stat.m_rxOctets, &stat.m_rxPacketsLost, &stat.m_rxJitter,
                                      &stat.m_txPackets, &stat.m_txOctets, &stat.m_roundTripTime})
        *counter = number++;
}

CC_QoS WITH_STATISTICS(bool hasLocal, bool hasRemote)
{
    CC_QoS qos = SCORED(412);
    RTP& rtp = qos.m_mediaInfo.select(qos.m_mediaInfo.m_rtp);
    RTP::RtpStat& statistics = rtp.setPresent(rtp.m_statistics);
    if (hasLocal)
        COUNT(statistics.setPresent(statistics.m_local), 11);
    if (hasRemote)
        COUNT(statistics.setPresent(statistics.m_remote), 21);
    return qos;
}

/// The entries as "level,detail key=text", one to a line.
std::string ENTRIES(CC_QoS const& qos, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                    unsigned int detail, char const* prefix = "")
{
    InfoContainer info;
    CC_PropertyQoS const property(CC_PropertyId::QUALITY_OF_SERVICE, qos);
    EXPECT_EQ(&info, &property.getQoSInfo(info, maxLevel, level, maxDetail, detail, prefix));
    std::string entries;
    for (unsigned int i = 0; i < info.getNumberOfEntries(); ++i)
    {
        InfoContainer::Entry const& entry = info.getEntry(i);
        entries += std::to_string(entry.level) + "," + std::to_string(entry.detail) + " " + entry.key.c_str() + "=" +
                   entry.text.c_str() + "\n";
    }
    return entries;
}

std::string TEXT_OF(CC_QoS const& qos) { return VALUE_OF(CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE, qos)); }
} // namespace

TEST(CC_PropertyQoS, HasItsNames)
{
    CC_PropertyQoS const property(CC_PropertyId::QUALITY_OF_SERVICE);
    EXPECT_STREQ("QoS", property.getTypeName());
    EXPECT_STREQ("Quality-Of-Service", property.getPropertyName());
    EXPECT_STREQ("qos", property.getPropertyShortName());
    EXPECT_TRUE(property.getValue() == CC_QoS());
}

TEST(CC_PropertyQoS, TheScoreIsInHundredths)
{
    EXPECT_EQ("1,0 MOS=4.12\n", ENTRIES(SCORED(412), ALL, 0, ALL, 0));
    EXPECT_EQ("1,0 MOS=4.05\n", ENTRIES(SCORED(405), ALL, 0, ALL, 0));
    EXPECT_EQ("1,0 MOS=0.00\n", ENTRIES(SCORED(0), ALL, 0, ALL, 0));
    EXPECT_EQ("1,0 MOS=-1.-28\n", ENTRIES(SCORED(-128), ALL, 0, ALL, 0)); // quotient and remainder as they are
}

TEST(CC_PropertyQoS, ShowsATrunksChannel)
{
    CC_QoS qos = SCORED(350);
    qos.m_mediaInfo.select(qos.m_mediaInfo.m_ds0);
    EXPECT_EQ("1,0 MOS=3.50\n1,0 Media=DS0\n", ENTRIES(qos, ALL, 0, ALL, 0));
}

TEST(CC_PropertyQoS, ShowsTheCodecOfAnRtpStreamWhereItIsKnown)
{
    CC_QoS qos = SCORED(350);
    RTP& rtp = qos.m_mediaInfo.select(qos.m_mediaInfo.m_rtp);
    EXPECT_EQ("1,0 MOS=3.50\n", ENTRIES(qos, ALL, 0, ALL, 0));
    rtp.setPresent(rtp.m_config).m_mediaType.set({MG_Rtp::ECodec::PCMA, 20});
    EXPECT_EQ("1,0 MOS=3.50\n1,0 Media=RTP PCMA 20ms\n", ENTRIES(qos, ALL, 0, ALL, 0));
    rtp.m_config.m_mediaType.set({static_cast<MG_Rtp::ECodec::Type>(77), 4294967295U});
    EXPECT_EQ("1,0 MOS=3.50\n1,0 Media=RTP (invalid) 4294967295ms\n", ENTRIES(qos, ALL, 0, ALL, 0));
}

TEST(CC_PropertyQoS, ShowsTheStatisticsOfEachEndUnderAHeadingOneLevelAbove)
{
    char const* const local = "3,4 MOS=4.12\n2,4 leg Local=\n3,4 Transmitted packets=15\n3,4 Transmitted octets=16\n"
                              "3,4 Received packets=11\n3,4 Received octets=12\n3,4 Lost packets=13\n"
                              "3,4 Jitter=14 ms\n3,4 Round-Trip time=17 ms\n";
    char const* const remote = "2,4 leg Remote=\n3,4 Transmitted packets=25\n3,4 Transmitted octets=26\n"
                               "3,4 Received packets=21\n3,4 Received octets=22\n3,4 Lost packets=23\n"
                               "3,4 Jitter=24 ms\n3,4 Round-Trip time=27 ms\n";
    EXPECT_EQ(std::string(local) + remote, ENTRIES(WITH_STATISTICS(true, true), ALL, 2, ALL, 4, "leg "));
    EXPECT_EQ(local, ENTRIES(WITH_STATISTICS(true, false), ALL, 2, ALL, 4, "leg "));
    EXPECT_EQ(std::string("3,4 MOS=4.12\n") + remote, ENTRIES(WITH_STATISTICS(false, true), ALL, 2, ALL, 4, "leg "));
    EXPECT_EQ("3,4 MOS=4.12\n", ENTRIES(WITH_STATISTICS(false, false), ALL, 2, ALL, 4, "leg "));
}

TEST(CC_PropertyQoS, CountersAreUnsigned)
{
    CC_QoS qos = WITH_STATISTICS(true, false);
    qos.m_mediaInfo.m_rtp.m_statistics.m_local.m_txPackets = -1;
    EXPECT_NE(std::string::npos, ENTRIES(qos, ALL, 0, ALL, 0).find("Transmitted packets=4294967295\n"));
}

TEST(CC_PropertyQoS, LeavesOutWhatLiesBeyondALimit)
{
    CC_QoS const qos = WITH_STATISTICS(true, true);
    EXPECT_EQ("2,0 Local=\n2,0 Remote=\n", ENTRIES(qos, 2, 2, 9, 0)); // the headings alone
    EXPECT_EQ("", ENTRIES(qos, 1, 2, 9, 0));
    EXPECT_EQ("", ENTRIES(qos, 9, 2, 0, 1));
    EXPECT_EQ(ENTRIES(qos, ALL, 2, ALL, 1), ENTRIES(qos, 3, 2, 1, 1));
}

TEST(CC_PropertyQoS, ItsTextIsTheTree)
{
    EXPECT_EQ("    MOS:                                 4.12\n"
              "  Local\n"
              "    Transmitted packets:                 15\n"
              "    Transmitted octets:                  16\n"
              "    Received packets:                    11\n"
              "    Received octets:                     12\n"
              "    Lost packets:                        13\n"
              "    Jitter:                              14 ms\n"
              "    Round-Trip time:                     17 ms\n",
              TEXT_OF(WITH_STATISTICS(true, false)));
    CC_QoS qos = SCORED(350);
    qos.m_mediaInfo.select(qos.m_mediaInfo.m_ds0);
    EXPECT_EQ("    MOS:                                 3.50\n    Media:                               DS0\n",
              TEXT_OF(qos));
}

TEST(CC_PropertyQoS, ComparesAssignsAndClones)
{
    CC_PropertyQoS property(CC_PropertyId::QUALITY_OF_SERVICE, WITH_STATISTICS(true, false));
    CC_PropertyQoS const other(CC_PropertyId::QUALITY_OF_SERVICE, WITH_STATISTICS(true, true));
    EXPECT_FALSE(property.isEqual(other));
    EXPECT_FALSE(property.isEqual(CC_PropertyBoolean(CC_PropertyId::QUALITY_OF_SERVICE)));
    property.assign(CC_PropertyBoolean(CC_PropertyId::QUALITY_OF_SERVICE));
    EXPECT_TRUE(property.getValue() == WITH_STATISTICS(true, false));
    property.assign(other);
    EXPECT_TRUE(property.isEqual(other));
    EXPECT_TRUE(property.isOfType(CC_Property::TYPE_ID()));
    EXPECT_EQ(CC_PropertyQoS::TYPE_ID(), property.getTypeId());
    std::unique_ptr<CC_Property> const clone(property.clone());
    EXPECT_TRUE(clone->isEqual(other));
    property = CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE);
    EXPECT_FALSE(clone->isEqual(property));
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "MOS: 5.00"));
}

TEST(CC_PropertyQoS, ADumpWithoutMemorySaysSo)
{
    CC_QoS qos = WITH_STATISTICS(true, true);
    RTP& rtp = qos.m_mediaInfo.m_rtp;
    rtp.setPresent(rtp.m_config).m_mediaType.set({MG_Rtp::ECodec::L16_STEREO, 20}); // a text that needs memory
    CC_PropertyQoS const property(CC_PropertyId::QUALITY_OF_SERVICE, qos);
    String const prefix("a prefix that needs memory of its own ");
    std::unique_ptr<InfoContainer> info;
    auto const dump = [&]
    {
        {
            FailingAllocator::Pause const unseen;
            info = std::make_unique<InfoContainer>();
        }
        property.getQoSInfo(*info, ALL, 0, ALL, 0, prefix);
    };
    EXPECT_LT(10U, WITH_EACH_ALLOCATION_FAILING(dump, [&] { EXPECT_TRUE(info->isIncomplete()); }));
    EXPECT_FALSE(info->isIncomplete());
    EXPECT_EQ(18U, info->getNumberOfEntries());
}
