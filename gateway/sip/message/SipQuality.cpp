#include "sip/message/SipQuality.h"

#include "sip/message/SipText.h"

#include <algorithm>
#include <iterator>
#include <string>

// Read here and not by the stack's own parser, which never comes back from some that are malformed.
namespace
{
using Codec = MG_Rtp::ECodec;

constexpr Codec::Type CODECS[] = {Codec::PCMU,    Codec::GSM,     Codec::G723, Codec::DVI4_8000,  Codec::DVI4_16000,
                                  Codec::LPC,     Codec::PCMA,    Codec::G722, Codec::L16_STEREO, Codec::L16_MONO,
                                  Codec::QCELP,   Codec::G728,    Codec::G729, Codec::G726_16,    Codec::G726_24,
                                  Codec::G726_32, Codec::G726_40, Codec::ILBC, Codec::OPUS};

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

/// Comfort noise and telephone events accompany a codec.
bool IS_COMPANION(std::string_view payloadType, std::string_view name)
{
    return SipText::IS_ONE_OF(name.substr(0, name.find('/')), {"CN", "telephone-event"}) ||
           (name.empty() && payloadType == "13");
}

/// By its name, or by the fixed payload type, which is its number.
Codec::Type CODEC_OF(std::string_view payloadType, std::string_view name)
{
    if (name.ends_with("/1"))
        name.remove_suffix(2);
    std::string const whole(name);
    std::string const encoding(name.substr(0, name.find('/')));
    auto const fits = [&](Codec::Type codec)
    {
        return name.empty() ? payloadType == std::to_string(codec)
                            : SipText::IS_ONE_OF(Codec::NAME(codec), {whole.c_str(), encoding.c_str()});
    };
    auto const* const found = std::find_if(std::begin(CODECS), std::end(CODECS), fits);
    return found != std::end(CODECS) ? *found : Codec::NONE;
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
        if (!IS_COMPANION(payloadType, name))
            return MG_Rtp::MediaType{CODEC_OF(payloadType, name),
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

std::optional<CC_QoS> SipQuality::getRecord() const
{
    if (!m_media)
        return std::nullopt;
    CC_QoS record;
    auto& rtp = record.m_mediaInfo.select(record.m_mediaInfo.m_rtp);
    rtp.m_codecChanges = static_cast<int>(m_codecChanges);
    if (m_media->codec != Codec::NONE)
        rtp.setPresent(rtp.m_config).m_mediaType.set(*m_media);
    return record;
}
