#include "properties/CC_PropertyQoS.h"

#include <new>

CC_PropertyQoS::TypeId CC_PropertyQoS::s_typeId;

namespace
{
using RTP = CC_QoS::MediaInfo::RTP;
using Stat = RTP::RtpStat::Stat;

constexpr unsigned int NO_LIMIT = 0xffffffff;
constexpr unsigned int TREE_LEVEL = 1;
constexpr unsigned int TREE_KEY_WIDTH = 41;

struct Counter
{
    char const* key;
    AsnInteger Stat::*value;
    char const* format;
};

// in the order in which they are shown
constexpr Counter COUNTERS[] = {
    {"Transmitted packets", &Stat::m_txPackets, "%u"},    {"Transmitted octets", &Stat::m_txOctets, "%u"},
    {"Received packets", &Stat::m_rxPackets, "%u"},       {"Received octets", &Stat::m_rxOctets, "%u"},
    {"Lost packets", &Stat::m_rxPacketsLost, "%u"},       {"Jitter", &Stat::m_rxJitter, "%u ms"},
    {"Round-Trip time", &Stat::m_roundTripTime, "%u ms"},
};

/// Adds entries to a dump, formatted, within the limits of one getInfo.
class Entries
{
public:
    Entries(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail, unsigned int detail)
        : m_info(info), m_maxLevel(maxLevel), m_level(level), m_maxDetail(maxDetail), m_detail(detail)
    {
    }

    void addHeading(String const& prefix, char const* label)
    {
        m_info.addWithin(m_maxLevel, m_level, m_maxDetail, m_detail, prefix, label, String::s_empty);
    }
    void addFigure(char const* key, String const& text)
    {
        m_info.addWithin(m_maxLevel, m_level + 1, m_maxDetail, m_detail, String::s_empty, key, text);
    }
    void addStatistics(String const& prefix, char const* label, Stat const& stat)
    {
        addHeading(prefix, label);
        String text;
        for (Counter const& counter : COUNTERS)
            addFigure(counter.key, text.format(counter.format, static_cast<unsigned int>(stat.*counter.value)));
    }

private:
    InfoContainer& m_info;
    unsigned int m_maxLevel;
    unsigned int m_level;
    unsigned int m_maxDetail;
    unsigned int m_detail;
};

void ADD_RTP(Entries& entries, String const& prefix, RTP const& rtp)
{
    if (rtp.isPresent(rtp.m_config))
    {
        MG_Rtp::MediaType const media = rtp.m_config.m_mediaType.get();
        String text;
        entries.addFigure("Media", text.format("RTP %s %ums", MG_Rtp::ECodec::NAME(media.codec), media.packetPeriod));
    }
    if (!rtp.isPresent(rtp.m_statistics))
        return;
    RTP::RtpStat const& statistics = rtp.m_statistics;
    if (statistics.isPresent(statistics.m_local))
        entries.addStatistics(prefix, "Local", statistics.m_local);
    if (statistics.isPresent(statistics.m_remote))
        entries.addStatistics(prefix, "Remote", statistics.m_remote);
}

void ADD_QOS(Entries& entries, String const& prefix, CC_QoS const& qos)
{
    int const score = qos.m_meanOpinionScore;
    String text;
    entries.addFigure("MOS", text.format("%d.%02d", score / 100, score % 100));
    CC_QoS::MediaInfo const& media = qos.m_mediaInfo;
    if (media.isSelected(media.m_rtp))
        ADD_RTP(entries, prefix, media.m_rtp);
    else if (media.isSelected(media.m_ds0))
        entries.addFigure("Media", "DS0");
}
} // namespace

String& CC_PropertyQoS::getValueString(String& out) const
{
    InfoContainer info;
    getQoSInfo(info, NO_LIMIT, TREE_LEVEL, NO_LIMIT, 0, String::s_empty);
    return info.getString_TreeFormat(out, TREE_KEY_WIDTH, 0, 0);
}

InfoContainer& CC_PropertyQoS::getQoSInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                          unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    try
    {
        Entries entries(info, maxLevel, level, maxDetail, detail);
        ADD_QOS(entries, prefix, getValue());
    }
    catch (std::bad_alloc const&)
    {
        info.markIncomplete();
    }
    return info;
}
