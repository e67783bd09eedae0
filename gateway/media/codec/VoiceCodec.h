#pragma once

#include "platform/media/MG_Rtp.h"

#include <cstddef>
#include <memory>
#include <span>

/// Makes sound of a codec's payloads: 16 bits linear, one channel.
class VoiceDecoder
{
public:
    static constexpr std::size_t MOST_SAMPLES = 5760; ///< that a payload may hold: 120 ms at 48 kHz

    virtual ~VoiceDecoder() = default;
    /// How many samples a payload holds; 0: it is none of the codec's. REQUIRES: room for MOST_SAMPLES.
    virtual std::size_t decode(std::span<unsigned char const> payload, std::span<short> samples) = 0;
    /// Fills `samples` with what may have been in a lost packet.
    virtual void conceal(std::span<short> samples) = 0;
};

/// Makes a codec's payloads of sound.
class VoiceEncoder
{
public:
    static constexpr std::size_t MOST_OCTETS = 1500;

    virtual ~VoiceEncoder() = default;
    /// The octets of one payload; 0: so much sound cannot be one. REQUIRES: room for MOST_OCTETS.
    virtual std::size_t encode(std::span<short const> samples, std::span<unsigned char> payload) = 0;
};

/// The codecs that the media layer speaks itself: G.711, G.722, Opus and linear sound in one channel. The others it
/// only relays.
namespace VoiceCodec
{
bool IS_SPOKEN(MG_Rtp::ECodec::Type codec);
/// At which rate the codec's sound is sampled, in Hz. Opus takes what is asked of it: `wanted`, one of 8000, 16000 and
/// 48000.
unsigned int RATE_OF(MG_Rtp::ECodec::Type codec, unsigned int wanted);
/// Null for a codec that is not spoken, and without memory. `rate`: as RATE_OF says. @{
std::unique_ptr<VoiceDecoder> MAKE_DECODER(MG_Rtp::ECodec::Type codec, unsigned int rate);
std::unique_ptr<VoiceEncoder> MAKE_ENCODER(MG_Rtp::ECodec::Type codec, unsigned int rate);
/// @}
/// Milliseconds that a packet holds if it shall hold so many; 0: 20.
unsigned int PERIOD(MG_Rtp::ECodec::Type codec, unsigned int wanted);
} // namespace VoiceCodec
