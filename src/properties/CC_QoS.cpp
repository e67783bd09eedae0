#include "properties/CC_QoS.h"

void CC_QoS::MediaInfo::RTP::RtpStat::Stat::declareStat()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Stat::m_rxPackets>("rxPackets", AsnImplicit(1)),
        AsnField::OF<&Stat::m_rxOctets>("rxOctets", AsnImplicit(2)),
        AsnField::OF<&Stat::m_rxPacketsLost>("rxPacketsLost", AsnImplicit(3)),
        AsnField::OF<&Stat::m_rxJitter>("rxJitter", AsnImplicit(4)),
        AsnField::OF<&Stat::m_txPackets>("txPackets", AsnImplicit(5)),
        AsnField::OF<&Stat::m_txOctets>("txOctets", AsnImplicit(6)),
        AsnField::OF<&Stat::m_roundTripTime>("roundTripTime", AsnImplicit(7)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_QoS::MediaInfo::RTP::RtpStat::declareRtpStat()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&RtpStat::m_local>("local", AsnImplicit(1), AsnOptional()),
        AsnField::OF<&RtpStat::m_remote>("remote", AsnImplicit(2), AsnOptional()),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_QoS::MediaInfo::RTP::RtpCfg::MediaType::declareMediaType()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&MediaType::m_codec>("codec", AsnImplicit(1)),
        AsnField::OF<&MediaType::m_packetPeriod>("packetPeriod", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_QoS::MediaInfo::RTP::RtpCfg::declareRtpCfg()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&RtpCfg::m_mediaType>("mediaType", AsnImplicit(1)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_QoS::MediaInfo::RTP::declareRTP()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&RTP::m_codecChanges>("codecChanges", AsnImplicit(1)),
        AsnField::OF<&RTP::m_config>("config", AsnImplicit(2), AsnOptional()),
        AsnField::OF<&RTP::m_statistics>("statistics", AsnImplicit(3), AsnOptional()),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_QoS::MediaInfo::declareMediaInfo()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&MediaInfo::m_rtp>("rtp", AsnImplicit(1)),
        AsnField::OF<&MediaInfo::m_ds0>("ds0", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_QoS::declareCC_QoS()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&CC_QoS::m_voiceQuality>("voiceQuality", AsnImplicit(1)),
        AsnField::OF<&CC_QoS::m_meanOpinionScore>("meanOpinionScore", AsnImplicit(2)),
        AsnField::OF<&CC_QoS::m_mediaInfo>("mediaInfo", AsnImplicit(3)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}
