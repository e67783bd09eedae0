#include "platform/media/MG_Rtp.h"

#include "platform/base/NameOf.h"

namespace
{
using Codec = MG_Rtp::ECodec;

constexpr NamedValue<Codec::Type> s_names[] = {
    {Codec::NONE, "None"},
    {Codec::PCMU, "PCMU"},
    {Codec::GSM, "GSM"},
    {Codec::G723, "G723"},
    {Codec::DVI4_8000, "DVI4/8000"},
    {Codec::DVI4_16000, "DVI4/16000"},
    {Codec::LPC, "LPC"},
    {Codec::PCMA, "PCMA"},
    {Codec::G722, "G722"},
    {Codec::L16_STEREO, "L16/44100/2"},
    {Codec::L16_MONO, "L16/44100"},
    {Codec::QCELP, "QCELP"},
    {Codec::G728, "G728"},
    {Codec::G729, "G729"},
    {Codec::G726_16, "G726-16"},
    {Codec::G726_24, "G726-24"},
    {Codec::G726_32, "G726-32"},
    {Codec::G726_40, "G726-40"},
    {Codec::ILBC, "iLBC"},
    {Codec::OPUS, "opus"},
    {Codec::CLEARMODE, "CLEARMODE"},
};
} // namespace

char const* MG_Rtp::ECodec::NAME(Type codec) { return NAME_OF(s_names, codec); }
