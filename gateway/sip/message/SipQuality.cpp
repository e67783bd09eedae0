#include "sip/message/SipQuality.h"

#include "sip/message/SipCodec.h"
#include "sip/message/SipText.h"

#include <string>

// Read here and not by the stack's own parser, which never comes back from some that are malformed.
namespace
{
using Codec = MG_Rtp::ECodec;

constexpr unsigned int LONGEST_PERIOD = 1000; // milliseconds
constexpr unsigned int MOST_COMPANIONS = 16;  // before the codec; each is searched for in the whole description
constexpr std::string_view MEDIA = "\nm=";

/// What follows the first line break and `beginning`, up to the end of that line.
std::string_view FIND_VALUE(std::string_view lines, std::string_view beginning)
{
    std::size_t const at = lines.find(beginning);
    if (at == std::string_view::npos)
        return {};
    std::string_view const value = lines.substr(at + beginning.size());
    return SipText::TRIM(value.substr(0, value.find('\n')));
}

/// The payload types of a stream ("0 8 101"); none for one that is refused or no voice over RTP.
std::string_view PAYLOAD_TYPES_OF(std::string_view stream)
{
    std::string_view rest = FIND_VALUE(stream, MEDIA);
    bool const isAudio = SipText::CUT(rest, ' ') == "audio";
    std::string_view port = SipText::CUT(rest, ' ');
    bool const isOpen = SipText::NUMBER(SipText::CUT(port, '/'), 1, 65535) != 0;
    bool const isRtp = SipText::CUT(rest, ' ').find("RTP/") != std::string_view::npos;
    return isAudio && isOpen && isRtp ? rest : std::string_view();
}

/// The first such stream, from its line break on; empty without one.
std::string_view FIND_VOICE(std::string_view session)
{
    std::size_t next = 0;
    for (std::size_t at = session.find(MEDIA); at != std::string_view::npos; at = next)
    {
        next = session.find(MEDIA, at + 1);
        std::string_view const stream = session.substr(at, next == std::string_view::npos ? next : next - at);
        if (!PAYLOAD_TYPES_OF(stream).empty())
            return stream;
    }
    return {};
}

/// "opus/48000/2" as the stream's description maps it; empty for a payload type that it does not.
std::string_view NAME_OF(std::string_view stream, std::string_view payloadType)
{
    return FIND_VALUE(stream, "\na=rtpmap:" + std::string(payloadType) + " ");
}
} // namespace

std::optional<MG_Rtp::MediaType> SipQuality::MEDIA_OF(std::string_view sessionDescription)
{
    std::string_view const stream = FIND_VOICE(sessionDescription);
    std::string_view rest = PAYLOAD_TYPES_OF(stream);
    for (unsigned int companions = 0; companions <= MOST_COMPANIONS && !rest.empty(); ++companions)
    {
        std::string_view const payloadType = SipText::CUT(rest, ' ');
        std::string_view const name = NAME_OF(stream, payloadType);
        if (!SipCodec::IS_COMPANION(payloadType, name))
            return MG_Rtp::MediaType{SipCodec::OF(payloadType, name),
                                     SipText::NUMBER(FIND_VALUE(stream, "\na=ptime:"), 1, LONGEST_PERIOD)};
    }
    return std::nullopt;
}

void SipQuality::noteAnswer(std::string_view sessionDescription)
{
    std::optional<MG_Rtp::MediaType> const media = MEDIA_OF(sessionDescription);
    if (!media)
        return;
    if (m_media && m_media->codec != media->codec)
        ++m_codecChanges;
    m_media = media;
}

namespace
{
using Rtp = decltype(CC_QoS::m_mediaInfo.m_rtp);

int NUMBER(unsigned long long counter) { return static_cast<int>(counter); } // its low bits, as the record carries it

void RECORD(CC_QoS& record, Rtp& rtp, MediaQuality const& measured)
{
    auto& statistics = rtp.setPresent(rtp.m_statistics);
    auto& local = statistics.setPresent(statistics.m_local);
    local.m_rxPackets = NUMBER(measured.receivedPackets);
    local.m_rxOctets = NUMBER(measured.receivedOctets);
    local.m_rxPacketsLost = NUMBER(measured.lostPackets.value_or(0));
    local.m_rxJitter = NUMBER(measured.jitter.value_or(0));
    local.m_txPackets = NUMBER(measured.sentPackets);
    local.m_txOctets = NUMBER(measured.sentOctets);
    local.m_roundTripTime = NUMBER(measured.roundTripTime.value_or(0));
    if (measured.farLostPackets)
    {
        auto& remote = statistics.setPresent(statistics.m_remote);
        remote.m_rxPacketsLost = NUMBER(*measured.farLostPackets);
        remote.m_rxJitter = NUMBER(measured.farJitter.value_or(0));
    }
    record.m_meanOpinionScore = NUMBER(measured.meanOpinionScore.value_or(0));
}
} // namespace

std::optional<CC_QoS> SipQuality::getRecord(MediaQuality const* measured) const
{
    if (!m_media)
        return std::nullopt;
    CC_QoS record;
    auto& rtp = record.m_mediaInfo.select(record.m_mediaInfo.m_rtp);
    rtp.m_codecChanges = static_cast<int>(m_codecChanges);
    if (m_media->codec != Codec::NONE)
        rtp.setPresent(rtp.m_config).m_mediaType.set(*m_media);
    if (measured != nullptr)
        RECORD(record, rtp, *measured);
    return record;
}
