#pragma once

#include "media/codec/VoiceCodec.h"

#include <opus/opus.h>

/// Opus (RFC 6716) for speech, in one channel. @{
class OpusVoiceDecoder : public VoiceDecoder
{
public:
    explicit OpusVoiceDecoder(unsigned int rate);
    std::size_t decode(std::span<unsigned char const> payload, std::span<short> samples) override;
    void conceal(std::span<short> samples) override;

private:
    std::unique_ptr<OpusDecoder, void (*)(OpusDecoder*)> m_state;
};

class OpusVoiceEncoder : public VoiceEncoder
{
public:
    explicit OpusVoiceEncoder(unsigned int rate);
    std::size_t encode(std::span<short const> samples, std::span<unsigned char> payload) override;

private:
    std::unique_ptr<OpusEncoder, void (*)(OpusEncoder*)> m_state;
};
/// @}
