#pragma once

#include "media/codec/Concealment.h"
#include "media/codec/VoiceCodec.h"

#include <spandsp.h>

/// G.722 with 64 kbit/s: an octet for two samples at 16 kHz. @{
class G722Decoder : public VoiceDecoder
{
public:
    G722Decoder() : m_state(g722_decode_init(nullptr, 64000, 0), g722_decode_free) {}
    std::size_t decode(std::span<unsigned char const> payload, std::span<short> samples) override;
    void conceal(std::span<short> samples) override { m_concealment.fill(samples); }

private:
    std::unique_ptr<g722_decode_state_t, int (*)(g722_decode_state_t*)> m_state;
    Concealment m_concealment{16000};
};

class G722Encoder : public VoiceEncoder
{
public:
    G722Encoder() : m_state(g722_encode_init(nullptr, 64000, 0), g722_encode_free) {}
    std::size_t encode(std::span<short const> samples, std::span<unsigned char> payload) override;

private:
    std::unique_ptr<g722_encode_state_t, int (*)(g722_encode_state_t*)> m_state;
};
/// @}
