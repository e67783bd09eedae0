#include "media/rtp/RtpRoutes.h"

#include <algorithm>

unsigned int RtpRoutes::CLOCK_RATE(MG_Rtp::ECodec::Type codec)
{
    switch (codec)
    {
    case MG_Rtp::ECodec::OPUS:
        return 48000;
    case MG_Rtp::ECodec::L16_MONO:
    case MG_Rtp::ECodec::L16_STEREO:
        return 44100;
    case MG_Rtp::ECodec::DVI4_16000:
        return 16000;
    default:
        return 8000;
    }
}

RtpRoutes::RtpRoutes(MediaDescription const& from, MediaDescription const* to)
{
    if (from.formats.getSize() != 0)
        m_clockRate = CLOCK_RATE(from.formats.begin()->codec.getCodec());
    // an event's clock is that of the voice in whose stream it travels
    add(from.comfortNoise, {NOISE, 0, to == nullptr ? MediaPayloadTypes::NONE : to->comfortNoise.send, m_clockRate});
    add(from.telephoneEvent,
        {EVENT, 0, to == nullptr ? MediaPayloadTypes::NONE : to->telephoneEvent.send, m_clockRate});
    unsigned char index = 0;
    for (MediaFormat const& format : from.formats)
    {
        MediaFormat const* const taken = to == nullptr ? nullptr : to->formats.find(format.codec.getCodec());
        add(format.types, {VOICE, index++, taken == nullptr ? MediaPayloadTypes::NONE : taken->types.send,
                           CLOCK_RATE(format.codec.getCodec())});
    }
}

void RtpRoutes::add(MediaPayloadTypes const& types, Route const& route)
{
    if (types.isAgreed() && (route.kind != VOICE || m_routes[types.receive].kind != VOICE)) // the first of two wins
        m_routes[types.receive] = route;
}

bool RtpRoutes::areAllRelayed(MediaDescription const& from) const
{
    return std::all_of(from.formats.begin(), from.formats.end(),
                       [this](MediaFormat const& format)
                       { return get(format.types.receive).relayType != MediaPayloadTypes::NONE; });
}
