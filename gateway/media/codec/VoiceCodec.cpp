#include "media/codec/VoiceCodec.h"

#include "media/codec/G711Codec.h"
#include "media/codec/G722Codec.h"
#include "media/codec/L16Codec.h"
#include "media/codec/OpusCodec.h"

namespace
{
using ECodec = MG_Rtp::ECodec;
}

bool VoiceCodec::IS_SPOKEN(ECodec::Type codec)
{
    return codec == ECodec::PCMA || codec == ECodec::PCMU || codec == ECodec::G722 || codec == ECodec::OPUS ||
           codec == ECodec::L16_MONO;
}

unsigned int VoiceCodec::RATE_OF(ECodec::Type codec, unsigned int wanted)
{
    switch (codec)
    {
    case ECodec::OPUS:
        return wanted;
    case ECodec::G722:
        return 16000;
    case ECodec::L16_MONO:
        return 44100;
    default:
        return 8000;
    }
}

std::unique_ptr<VoiceDecoder> VoiceCodec::MAKE_DECODER(ECodec::Type codec, unsigned int rate)
try
{
    switch (codec)
    {
    case ECodec::PCMA:
    case ECodec::PCMU:
        return std::make_unique<G711Decoder>(codec == ECodec::PCMA);
    case ECodec::G722:
        return std::make_unique<G722Decoder>();
    case ECodec::L16_MONO:
        return std::make_unique<L16Decoder>();
    case ECodec::OPUS:
        return std::make_unique<OpusVoiceDecoder>(rate);
    default:
        return nullptr;
    }
}
catch (std::bad_alloc const&)
{
    return nullptr;
}

std::unique_ptr<VoiceEncoder> VoiceCodec::MAKE_ENCODER(ECodec::Type codec, unsigned int rate)
try
{
    switch (codec)
    {
    case ECodec::PCMA:
    case ECodec::PCMU:
        return std::make_unique<G711Encoder>(codec == ECodec::PCMA);
    case ECodec::G722:
        return std::make_unique<G722Encoder>();
    case ECodec::L16_MONO:
        return std::make_unique<L16Encoder>();
    case ECodec::OPUS:
        return std::make_unique<OpusVoiceEncoder>(rate);
    default:
        return nullptr;
    }
}
catch (std::bad_alloc const&)
{
    return nullptr;
}

unsigned int VoiceCodec::PERIOD(ECodec::Type codec, unsigned int wanted)
{
    if (codec == ECodec::L16_MONO)
        return 10; // 20 ms would not go through a network in one piece
    if (codec == ECodec::OPUS)
        return wanted == 10 || wanted == 40 || wanted == 60 ? wanted : 20; // it has no others
    return wanted >= 10 && wanted <= 60 && wanted % 10 == 0 ? wanted : 20;
}
