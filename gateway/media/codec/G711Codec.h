#pragma once

#include "media/codec/Concealment.h"
#include "media/codec/VoiceCodec.h"

/// G.711: an octet for each sample at 8 kHz, in A-law or mu-law. @{
class G711Decoder : public VoiceDecoder
{
public:
    explicit G711Decoder(bool isALaw) : m_isALaw(isALaw) {}
    std::size_t decode(std::span<unsigned char const> payload, std::span<short> samples) override;
    void conceal(std::span<short> samples) override { m_concealment.fill(samples); }

private:
    bool m_isALaw;
    Concealment m_concealment{8000};
};

class G711Encoder : public VoiceEncoder
{
public:
    explicit G711Encoder(bool isALaw) : m_isALaw(isALaw) {}
    std::size_t encode(std::span<short const> samples, std::span<unsigned char> payload) override;

private:
    bool m_isALaw;
};
/// @}
