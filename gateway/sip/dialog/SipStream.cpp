#include "sip/dialog/SipStream.h"

#include "sip/dialog/SipParsedDescription.h"
#include "sip/message/SipCodec.h"
#include "sip/message/SipText.h"

namespace
{
constexpr unsigned int LONGEST_PERIOD = 200; // milliseconds
constexpr unsigned int DEFAULT_PERIOD = 20;  // RFC 3551, 4.2

bool IS_CARRIED(sdp_media_t const& media)
{
    return media.m_type == sdp_media_audio && media.m_proto == sdp_proto_rtp && media.m_rejected == 0 &&
           media.m_port != 0;
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

bool IS_COMPANION(sdp_rtpmap_t const& format)
{
    return SipCodec::IS_COMPANION(std::to_string(format.rm_pt), NAME_OF(format));
}

bool IS_NAMED(sdp_rtpmap_t const& format, char const* encoding)
{
    return format.rm_encoding != nullptr && SipText::IS_ONE_OF(format.rm_encoding, {encoding});
}

/// Takes out of a list what is not to stay.
template <class Element, class IsToStay>
void FILTER(Element*& first, Element* Element::*next, IsToStay const& isToStay)
{
    for (Element** place = &first; *place != nullptr;)
        if (isToStay(**place))
            place = &((*place)->*next);
        else
            *place = (*place)->*next;
}

bool MAY_STAY(sdp_attribute_t const& attribute)
{
    return SipText::IS_ONE_OF(attribute.a_name, {"ptime", "maxptime", "silenceSupp"});
}

void TAKE_OVER(sdp_media_t& media, unsigned short port)
{
    media.m_port = port;
    media.m_number_of_ports = 0;
    FILTER(media.m_rtpmaps, &sdp_rtpmap_t::rm_next,
           [](sdp_rtpmap_t const& format) { return CODEC_OF(format) != MG_Rtp::ECodec::NONE || IS_COMPANION(format); });
}

bool HAS_CODEC(sdp_media_t const& media)
{
    for (sdp_rtpmap_t const* format = media.m_rtpmaps; format != nullptr; format = format->rm_next)
        if (CODEC_OF(*format) != MG_Rtp::ECodec::NONE)
            return true;
    return false;
}

unsigned int PERIOD_OF(sdp_media_t const& media)
{
    for (sdp_attribute_t const* attribute = media.m_attributes; attribute != nullptr; attribute = attribute->a_next)
        if (SipText::IS_ONE_OF(attribute->a_name, {"ptime"}) && attribute->a_value != nullptr)
            if (unsigned int const period = SipText::NUMBER(attribute->a_value, 1, LONGEST_PERIOD); period != 0)
                return period;
    return DEFAULT_PERIOD;
}

MediaAddress ADDRESS_OF(sdp_media_t const& media)
{
    sdp_connection_t const* const connection = sdp_media_connections(&media);
    if (connection == nullptr || connection->c_address == nullptr)
        return {};
    return MediaAddress::OF(connection->c_address, static_cast<unsigned short>(media.m_port));
}

VoipCodecAndMode::Mode MODE_OF(sdp_media_t const& ours, sdp_media_t const& far)
{
    bool const sends = (ours.m_mode & sdp_sendonly) != 0 && (far.m_mode & sdp_recvonly) != 0;
    bool const receives = (ours.m_mode & sdp_recvonly) != 0 && (far.m_mode & sdp_sendonly) != 0;
    if (sends)
        return receives ? VoipCodecAndMode::SEND_RECEIVE : VoipCodecAndMode::SEND_ONLY;
    return receives ? VoipCodecAndMode::RECEIVE_ONLY : VoipCodecAndMode::INACTIVE;
}

bool IS_SAME(sdp_rtpmap_t const& ours, sdp_rtpmap_t const& far)
{
    MG_Rtp::ECodec::Type const codec = CODEC_OF(ours);
    if (codec != MG_Rtp::ECodec::NONE)
        return codec == CODEC_OF(far);
    return ours.rm_encoding != nullptr && IS_NAMED(far, ours.rm_encoding) && ours.rm_rate == far.rm_rate;
}

sdp_rtpmap_t const* FIND(sdp_media_t const& media, sdp_rtpmap_t const& format)
{
    sdp_rtpmap_t const* found = media.m_rtpmaps;
    while (found != nullptr && !IS_SAME(*found, format))
        found = found->rm_next;
    return found;
}

MediaDescription DESCRIBE(sdp_media_t const& ours, sdp_media_t const& far)
{
    MediaDescription result;
    result.rtp = ADDRESS_OF(far);
    result.mode = MODE_OF(ours, far);
    for (sdp_rtpmap_t const* format = far.m_rtpmaps; format != nullptr; format = format->rm_next)
    {
        sdp_rtpmap_t const* const same = FIND(ours, *format);
        if (same == nullptr)
            continue;
        MediaPayloadTypes const types{static_cast<unsigned char>(same->rm_pt),
                                      static_cast<unsigned char>(format->rm_pt)};
        if (IS_NAMED(*format, "telephone-event"))
            result.telephoneEvent = result.telephoneEvent.isAgreed() ? result.telephoneEvent : types;
        else if (IS_NAMED(*format, "CN"))
            result.comfortNoise = types;
        else if (result.formats.find(CODEC_OF(*format)) == nullptr)
            result.formats.add({VoipCodec(CODEC_OF(*format), PERIOD_OF(far)), types});
    }
    return result;
}
} // namespace

std::string SipStream::WITH_ADDRESS(std::string_view description, Origin const& origin)
{
    SipParsedDescription const parsed(description);
    sdp_session_t* const session = parsed.get();
    if (session == nullptr)
        return {};
    String buffer;
    std::string const host = origin.rtp.host.getIpAddrAsString(buffer).c_str();
    sdp_connection_t address{};
    address.c_size = sizeof address;
    address.c_nettype = sdp_net_in;
    address.c_addrtype = origin.rtp.host.getVersion() == 6 ? sdp_addr_ip6 : sdp_addr_ip4;
    address.c_address = host.c_str();
    sdp_origin_t from{};
    from.o_size = sizeof from;
    from.o_username = "gateway";
    from.o_id = origin.session;
    from.o_version = origin.version;
    from.o_address = &address;
    session->sdp_origin = &from;
    session->sdp_connection = &address;
    FILTER(session->sdp_attributes, &sdp_attribute_t::a_next, MAY_STAY);
    bool isFound = false;
    for (sdp_media_t* media = session->sdp_media; media != nullptr; media = media->m_next)
    {
        media->m_connections = nullptr;
        FILTER(media->m_attributes, &sdp_attribute_t::a_next, MAY_STAY);
        bool const isIt = !isFound && IS_CARRIED(*media);
        if (isIt)
            TAKE_OVER(*media, origin.rtp.port);
        isFound = isFound || isIt;
        if (!isIt || !HAS_CODEC(*media))
        {
            media->m_port = 0;
            media->m_rejected = 1;
        }
    }
    return parsed.print();
}

std::optional<MediaDescription> SipStream::AGREED(std::string_view ours, std::string_view far)
{
    SipParsedDescription const parsedOurs(ours);
    SipParsedDescription const parsedFar(far);
    if (parsedOurs.get() == nullptr || parsedFar.get() == nullptr)
        return std::nullopt;
    sdp_media_t const* theirs = parsedFar.get()->sdp_media;
    for (sdp_media_t const* media = parsedOurs.get()->sdp_media; media != nullptr && theirs != nullptr;
         media = media->m_next, theirs = theirs->m_next)
        if (IS_CARRIED(*media) && IS_CARRIED(*theirs))
            return DESCRIBE(*media, *theirs);
    return std::nullopt;
}
