#pragma once

#include "media/codec/VoiceCodec.h"
#include "media/tone/Tone.h"

#include <memory>
#include <optional>
#include <spandsp.h>

/// Hears digits (DTMF, ITU-T Q.23 and Q.24) in what is spoken, of packets as they come: for far sides that send no
/// telephone events. Told as soon as a digit is recognised.
class DtmfDetector
{
public:
    DtmfDetector();

    void hear(MG_Rtp::ECodec::Type codec, std::span<unsigned char const> payload);
    /// The next digit that was heard.
    std::optional<char> take();

    /// The sound of the digit of a telephone event, 0 to 15. It lives for ever.
    static Tone const& SOUND_OF(unsigned char event);

private:
    MG_Rtp::ECodec::Type m_codec = MG_Rtp::ECodec::NONE;
    unsigned int m_rate = 8000; // of what is decoded, Hz
    std::unique_ptr<VoiceDecoder> m_decoder;
    std::unique_ptr<class Resampler> m_resampler;
    std::unique_ptr<dtmf_rx_state_t, int (*)(dtmf_rx_state_t*)> m_state;
    std::array<short, VoiceDecoder::MOST_SAMPLES> m_samples{};
    std::array<short, VoiceDecoder::MOST_SAMPLES> m_heard{};
};
