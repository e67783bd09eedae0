#include "sip/message/SipCodec.h"

#include "media/rtp/RtpRoutes.h"
#include "sip/message/SipText.h"

#include <algorithm>
#include <iterator>
#include <string>

namespace
{
using Codec = MG_Rtp::ECodec;

constexpr Codec::Type CODECS[] = {Codec::PCMU,    Codec::GSM,     Codec::G723, Codec::DVI4_8000,  Codec::DVI4_16000,
                                  Codec::LPC,     Codec::PCMA,    Codec::G722, Codec::L16_STEREO, Codec::L16_MONO,
                                  Codec::QCELP,   Codec::G728,    Codec::G729, Codec::G726_16,    Codec::G726_24,
                                  Codec::G726_32, Codec::G726_40, Codec::ILBC, Codec::OPUS,       Codec::CLEARMODE};
} // namespace

bool SipCodec::IS_COMPANION(std::string_view payloadType, std::string_view name)
{
    return SipText::IS_ONE_OF(name.substr(0, name.find('/')), {"CN", "telephone-event"}) ||
           (name.empty() && payloadType == "13");
}

/// By its name, or by the fixed payload type, which is its number.
MG_Rtp::ECodec::Type SipCodec::OF(std::string_view payloadType, std::string_view name)
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

std::string SipCodec::ENCODING(MG_Rtp::ECodec::Type codec)
{
    std::string name = Codec::NAME(codec);
    if (name.find('/') != std::string::npos)
        return name;
    return name + "/" + std::to_string(RtpRoutes::CLOCK_RATE(codec)) + (codec == Codec::OPUS ? "/2" : "");
}

MG_Rtp::ECodec::Type SipCodec::NAMED(std::string_view name)
{
    if (SipText::EQUALS_IGNORING_CASE(name, "L16"))
        return Codec::L16_MONO;
    return name.empty() ? Codec::NONE : OF({}, name);
}
