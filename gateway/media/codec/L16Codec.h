#pragma once

#include "media/codec/Concealment.h"
#include "media/codec/VoiceCodec.h"

/// Linear sound in network order, one channel. @{
class L16Decoder : public VoiceDecoder
{
public:
    std::size_t decode(std::span<unsigned char const> payload, std::span<short> samples) override;
    void conceal(std::span<short> samples) override { m_concealment.fill(samples); }

private:
    Concealment m_concealment{44100};
};

class L16Encoder : public VoiceEncoder
{
public:
    std::size_t encode(std::span<short const> samples, std::span<unsigned char> payload) override;
};
/// @}
