#pragma once

#include "media/codec/Resampler.h"
#include "media/codec/VoiceCodec.h"

#include <vector>

/// Payloads of a codec from frames of sound, whatever rate and period each has.
///
///     sender.add(frame);
///     while (std::span<unsigned char const> payload = sender.take(); !payload.empty())
///         ...
class VoiceSender
{
public:
    /// `rate`: of the frames, in Hz. `period`: milliseconds of sound in a packet, 0: 20. Throws std::bad_alloc.
    VoiceSender(unsigned int rate, MG_Rtp::MediaType const& media);

    unsigned int getRate() const { return m_rate; }
    /// As it was made.
    MG_Rtp::MediaType const& getMedia() const { return m_media; }
    /// How many milliseconds a payload holds.
    unsigned int getPeriod() const { return m_period; }

    void add(std::span<short const> frame);
    /// The next payload, until the next call; empty: more sound is needed.
    std::span<unsigned char const> take();
    /// What is not yet a packet is forgotten: a pause follows.
    void clear() { m_size = 0; }

private:
    unsigned int m_rate;
    MG_Rtp::MediaType m_media;
    unsigned int m_period;
    std::unique_ptr<VoiceEncoder> m_encoder;
    Resampler m_resampler;
    std::size_t m_packet; // samples
    std::size_t m_size = 0;
    std::vector<short> m_samples;
    std::vector<unsigned char> m_payload;
};
