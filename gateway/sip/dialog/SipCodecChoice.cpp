#include "sip/dialog/SipCodecChoice.h"

#include "media/codec/VoiceCodec.h"

#include <algorithm>
#include <iterator>

using namespace SipCodecChoice;

namespace
{
bool HAS(Codecs const& codecs, Codec codec) { return std::find(codecs.begin(), codecs.end(), codec) != codecs.end(); }

bool HAS_SPOKEN(Codecs const& codecs) { return std::any_of(codecs.begin(), codecs.end(), VoiceCodec::IS_SPOKEN); }

Codec FIRST_SPOKEN(Codecs const& codecs)
{
    auto const found = std::find_if(codecs.begin(), codecs.end(), VoiceCodec::IS_SPOKEN);
    return found != codecs.end() ? *found : MG_Rtp::ECodec::NONE;
}
} // namespace

Codecs SipCodecChoice::COMMON(Codecs const& codecs, Codecs const& others)
{
    Codecs common;
    std::copy_if(codecs.begin(), codecs.end(), std::back_inserter(common),
                 [&](Codec codec) { return HAS(others, codec); });
    return common;
}

Codecs SipCodecChoice::FOR_OFFER(Codecs const& own, Across const& across)
{
    Codecs offer;
    if (HAS(own, across.codec))
        offer.push_back(across.codec);
    Codecs supported = across.supported;
    if (across.codec != MG_Rtp::ECodec::NONE)
        supported.push_back(across.codec);
    for (Codec const codec : COMMON(own, supported))
        if (codec != across.codec)
            offer.push_back(codec);
    if (!supported.empty() && !HAS_SPOKEN(supported))
        return offer;
    std::copy_if(own.begin(), own.end(), std::back_inserter(offer),
                 [&](Codec codec) { return VoiceCodec::IS_SPOKEN(codec) && !HAS(supported, codec); });
    return offer;
}

Codec SipCodecChoice::FOR_ANSWER(Codecs const& offered, Across const& across)
{
    if (across.codec != MG_Rtp::ECodec::NONE)
    {
        if (HAS(offered, across.codec))
            return across.codec;
        return VoiceCodec::IS_SPOKEN(across.codec) ? FIRST_SPOKEN(offered) : MG_Rtp::ECodec::NONE;
    }
    if (across.supported.empty())
        return FIRST_SPOKEN(offered);
    Codecs const common = COMMON(offered, across.supported);
    if (!common.empty())
        return common.front();
    return HAS_SPOKEN(across.supported) ? FIRST_SPOKEN(offered) : MG_Rtp::ECodec::NONE;
}

/// The one that the peer likes best says it (RFC 4040).
QInformationTransferCapability SipCodecChoice::CAPABILITY_OF(Codecs const& offered)
{
    bool const isClear = !offered.empty() && offered.front() == MG_Rtp::ECodec::CLEARMODE;
    return isClear ? QInformationTransferCapability::UNRESTRICTED_DIGITAL : QInformationTransferCapability::SPEECH;
}

bool SipCodecChoice::HAS_COMPATIBLE(Codecs const& codecs, Codec other)
{
    return std::any_of(codecs.begin(), codecs.end(), [other](Codec codec) { return ARE_COMPATIBLE(codec, other); });
}

bool SipCodecChoice::ARE_COMPATIBLE(Codec one, Codec other)
{
    return one == other || (VoiceCodec::IS_SPOKEN(one) && VoiceCodec::IS_SPOKEN(other));
}
