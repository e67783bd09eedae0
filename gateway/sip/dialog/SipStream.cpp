#include "sip/dialog/SipStream.h"

#include "media/rtp/RtpRoutes.h"
#include "sip/dialog/SipParsedDescription.h"
#include "sip/message/SipCodec.h"
#include "sip/message/SipText.h"

#include <algorithm>

namespace
{
using Mode = VoipCodecAndMode::Mode;

constexpr unsigned int LONGEST_PERIOD = 200; // milliseconds
constexpr unsigned int DEFAULT_PERIOD = 20;  // RFC 3551, 4.2
constexpr unsigned char FIRST_DYNAMIC = 96;  // RFC 3551, 6
constexpr unsigned char LAST_DYNAMIC = 127;
constexpr unsigned char USUAL_OF_EVENTS = 101;

bool IS_CARRIED(sdp_media_t const& media)
{
    return media.m_type == sdp_media_audio && media.m_rejected == 0 && media.m_port != 0 &&
           (media.m_proto == sdp_proto_rtp || media.m_proto == sdp_proto_srtp);
}

/// "opus/48000/2"
std::string NAME_OF(sdp_rtpmap_t const& format)
{
    if (format.rm_predef != 0 || format.rm_encoding == nullptr)
        return {};
    std::string const name = std::string(format.rm_encoding) + "/" + std::to_string(format.rm_rate);
    return format.rm_params != nullptr ? name + "/" + format.rm_params : name;
}

MG_Rtp::ECodec::Type CODEC_OF(sdp_rtpmap_t const& format)
{
    return SipCodec::OF(std::to_string(format.rm_pt), NAME_OF(format));
}

char const* VALUE_OF(sdp_media_t const& media, char const* name)
{
    for (sdp_attribute_t const* attribute = media.m_attributes; attribute != nullptr; attribute = attribute->a_next)
        if (SipText::IS_ONE_OF(attribute->a_name, {name}) && attribute->a_value != nullptr)
            return attribute->a_value;
    return "";
}

MediaAddress ADDRESS_OF(sdp_media_t const& media)
{
    sdp_connection_t const* const connection = sdp_media_connections(&media);
    if (connection == nullptr || connection->c_address == nullptr)
        return {};
    return MediaAddress::OF(connection->c_address, static_cast<unsigned short>(media.m_port));
}

Mode MODE_OF(bool sends, bool receives)
{
    if (sends)
        return receives ? VoipCodecAndMode::SEND_RECEIVE : VoipCodecAndMode::SEND_ONLY;
    return receives ? VoipCodecAndMode::RECEIVE_ONLY : VoipCodecAndMode::INACTIVE;
}

bool SENDS(Mode mode) { return mode == VoipCodecAndMode::SEND_RECEIVE || mode == VoipCodecAndMode::SEND_ONLY; }

bool RECEIVES(Mode mode) { return mode == VoipCodecAndMode::SEND_RECEIVE || mode == VoipCodecAndMode::RECEIVE_ONLY; }

char const* NAME_OF(Mode mode)
{
    static constexpr char const* NAMES[] = {"sendrecv", "sendonly", "recvonly", "inactive"};
    return NAMES[mode];
}

/// "video 0 RTP/AVP 31"
std::string REFUSED(sdp_media_t const& media)
{
    std::string format = "0";
    if (media.m_rtpmaps != nullptr)
        format = std::to_string(media.m_rtpmaps->rm_pt);
    else if (media.m_format != nullptr && media.m_format->l_text != nullptr)
        format = media.m_format->l_text;
    return std::string(media.m_type_name) + " 0 " + media.m_proto_name + " " + format;
}

template <class Elements, class IsIt>
auto FIND(Elements const& elements, IsIt const& isIt)
{
    auto const found = std::find_if(elements.begin(), elements.end(), isIt);
    return found != elements.end() ? &*found : nullptr;
}

/// A payload type that a description names twice is what it is said to be first.
bool HAS_TYPE(SipStream const& stream, unsigned char type)
{
    auto const isIt = [type](auto const& known) { return known.type == type; };
    return FIND(stream.formats, isIt) != nullptr || FIND(stream.events, isIt) != nullptr;
}

void READ_FORMAT(SipStream& stream, sdp_rtpmap_t const& format)
{
    auto const type = static_cast<unsigned char>(format.rm_pt);
    auto const rate = static_cast<unsigned int>(format.rm_rate);
    if (HAS_TYPE(stream, type))
        return;
    if (format.rm_encoding != nullptr && SipText::IS_ONE_OF(format.rm_encoding, {"telephone-event"}))
    {
        if (FIND(stream.events, [rate](SipStream::Events const& known) { return known.rate == rate; }) == nullptr)
            stream.events.push_back({rate, type});
        return;
    }
    SipStream::Codec const codec = CODEC_OF(format);
    if (codec != MG_Rtp::ECodec::NONE &&
        FIND(stream.formats, [codec](SipStream::Format const& known) { return known.codec == codec; }) == nullptr)
        stream.formats.push_back({codec, type});
}

void READ_KEYS(SipStream& stream, sdp_media_t const& media)
{
    for (sdp_attribute_t const* attribute = media.m_attributes; attribute != nullptr; attribute = attribute->a_next)
        if (SipText::IS_ONE_OF(attribute->a_name, {"crypto"}) && attribute->a_value != nullptr)
            if (std::optional<SipCrypto> const crypto = SipCrypto::READ(attribute->a_value))
                stream.keys.push_back(*crypto);
}

void READ_STREAM(SipStream& stream, sdp_media_t const& media, SipStream::Security security)
{
    stream.isSecuredProfile = media.m_proto == sdp_proto_srtp;
    if (security != SipStream::PLAIN)
        READ_KEYS(stream, media);
    stream.rtp = ADDRESS_OF(media);
    stream.mode = MODE_OF((media.m_mode & sdp_sendonly) != 0, (media.m_mode & sdp_recvonly) != 0);
    stream.period = SipText::NUMBER(VALUE_OF(media, "ptime"), 1, LONGEST_PERIOD);
    for (sdp_rtpmap_t const* format = media.m_rtpmaps; format != nullptr; format = format->rm_next)
        READ_FORMAT(stream, *format);
}

bool IS_TAKEN(SipStream const& stream, SipStream::Security security)
{
    bool const mustHaveKeys = stream.isSecuredProfile || security == SipStream::SECURED;
    return !mustHaveKeys || !stream.keys.empty();
}

MediaKeys KEYS_AGREED(SipStream const& ours, SipStream const& far)
{
    for (SipCrypto const& theirs : far.keys)
        for (SipCrypto const& own : ours.keys)
            if (own.tag == theirs.tag && own.suite == theirs.suite)
                return {own.suite, own.key, theirs.key};
    return {};
}

/// RFC 3551, 4.5 and RFC 7587; with the annexes that would let a codec fall silent, which the other side may not know.
std::string LINES_OF(SipStream::Format const& format)
{
    std::string const type = std::to_string(format.type);
    std::string lines = "a=rtpmap:" + type + " " + SipCodec::ENCODING(format.codec) + "\r\n";
    if (format.codec == MG_Rtp::ECodec::G729)
        lines += "a=fmtp:" + type + " annexb=no\r\n";
    else if (format.codec == MG_Rtp::ECodec::G723)
        lines += "a=fmtp:" + type + " annexa=no\r\n";
    return lines;
}

std::string LINES_OF(SipStream::Events const& events)
{
    std::string const type = std::to_string(events.type);
    return "a=rtpmap:" + type + " telephone-event/" + std::to_string(events.rate) + "\r\na=fmtp:" + type + " 0-16\r\n";
}

MediaPayloadTypes EVENTS_AGREED(SipStream const& ours, SipStream const& far, unsigned int rate)
{
    for (SipStream::Events const& theirs : far.events)
        if (auto const* same = FIND(ours.events, [&](SipStream::Events const& one) { return one.rate == theirs.rate; });
            same != nullptr && theirs.rate == rate)
            return {same->type, theirs.type};
    return {};
}
} // namespace

std::optional<SipStream> SipStream::READ(std::string_view description, Security security)
{
    SipParsedDescription const parsed(description);
    if (parsed.get() == nullptr)
        return std::nullopt;
    std::vector<std::string> streams;
    std::optional<SipStream> found;
    for (sdp_media_t const* media = parsed.get()->sdp_media; media != nullptr; media = media->m_next)
    {
        SipStream stream;
        if (IS_CARRIED(*media))
        {
            stream.place = streams.size();
            READ_STREAM(stream, *media, security);
            bool const isBetter = !found || (found->keys.empty() && !stream.keys.empty());
            if (isBetter && IS_TAKEN(stream, security))
                found = std::move(stream);
        }
        streams.push_back(REFUSED(*media));
    }
    if (found)
        found->streams = std::move(streams);
    return found;
}

SipStream SipStream::getReply() const
{
    SipStream reply;
    reply.streams = streams;
    reply.place = place;
    reply.period = period;
    reply.isSecuredProfile = isSecuredProfile;
    return reply;
}

std::string SipStream::write(Origin const& origin) const
{
    String buffer;
    std::string const host = rtp.host.getIpAddrAsString(buffer).c_str();
    std::string const address = (rtp.host.getVersion() == 6 ? "IN IP6 " : "IN IP4 ") + host + "\r\n";
    std::string types;
    std::string lines;
    for (Format const& format : formats)
    {
        types += " " + std::to_string(format.type);
        lines += LINES_OF(format);
    }
    for (Events const& one : events)
    {
        types += " " + std::to_string(one.type);
        lines += LINES_OF(one);
    }
    std::string text = "v=0\r\no=gateway " + std::to_string(origin.session) + " " + std::to_string(origin.version) +
                       " " + address + "s=-\r\nc=" + address + "t=0 0\r\n";
    for (std::size_t i = 0; i < std::max<std::size_t>(streams.size(), 1); ++i)
    {
        if (i != place)
        {
            text += "m=" + streams[i] + "\r\n";
            continue;
        }
        text += "m=audio " + std::to_string(rtp.port) + (isSecuredProfile ? " RTP/SAVP" : " RTP/AVP");
        text.append(types).append("\r\n").append(lines);
        for (SipCrypto const& crypto : keys)
            text += "a=crypto:" + crypto.write() + "\r\n";
        text += "a=ptime:" + std::to_string(period != 0 ? period : DEFAULT_PERIOD) + "\r\n";
        text += std::string("a=") + NAME_OF(mode) + "\r\n";
    }
    return text;
}

unsigned char SipStream::getType(Codec codec) const
{
    if (auto const* const found = FIND(formats, [codec](Format const& format) { return format.codec == codec; }))
        return found->type;
    if (codec < FIRST_DYNAMIC)
        return static_cast<unsigned char>(codec); // its fixed one
    for (unsigned char type = FIRST_DYNAMIC; type < LAST_DYNAMIC; ++type)
        if (type != USUAL_OF_EVENTS && !FIND(formats, [type](Format const& format) { return format.type == type; }) &&
            !FIND(events, [type](Events const& one) { return one.type == type; }))
            return type;
    return LAST_DYNAMIC;
}

unsigned char SipStream::getEventsType(unsigned int rate) const
{
    if (auto const* const found = FIND(events, [rate](Events const& one) { return one.rate == rate; }))
        return found->type;
    for (unsigned char type = USUAL_OF_EVENTS; type < LAST_DYNAMIC; ++type)
        if (!FIND(formats, [type](Format const& format) { return format.type == type; }) &&
            !FIND(events, [type](Events const& one) { return one.type == type; }))
            return type;
    return LAST_DYNAMIC;
}

MediaDescription SipStream::AGREED(SipStream const& ours, SipStream const& far)
{
    MediaDescription result;
    result.rtp = far.rtp;
    result.keys = KEYS_AGREED(ours, far);
    result.mode = MODE_OF(SENDS(ours.mode) && RECEIVES(far.mode), RECEIVES(ours.mode) && SENDS(far.mode));
    unsigned int const period = far.period != 0 ? far.period : DEFAULT_PERIOD;
    for (Format const& theirs : far.formats)
        if (auto const* same = FIND(ours.formats, [&](Format const& one) { return one.codec == theirs.codec; }))
            result.formats.add({VoipCodec(theirs.codec, period), {same->type, theirs.type}});
    if (result.formats.getSize() != 0)
        result.telephoneEvent =
            EVENTS_AGREED(ours, far, RtpRoutes::CLOCK_RATE(result.formats.begin()->codec.getCodec()));
    if (result.formats.getSize() != 0 && !result.telephoneEvent.isAgreed())
        result.telephoneEvent = EVENTS_AGREED(ours, far, 8000); // many phones know no other clock
    return result;
}
