#pragma once

#include "media/codec/JitterBuffer.h"
#include "media/codec/Resampler.h"
#include "media/codec/VoiceCodec.h"

#include <vector>

/// Evenly timed sound of a stream of packets: jitter buffer, decoder, concealment of losses, the wanted rate. Packets
/// may hold any period, and change codec in the middle.
///
///     receiver.put(header, codec, payload);
///     bool const isTalking = receiver.take(frame); // every 20 ms
class VoiceReceiver
{
public:
    /// `rate`: of the sound that comes out, in Hz. Throws std::bad_alloc.
    explicit VoiceReceiver(unsigned int rate);

    unsigned int getRate() const { return m_rate; }
    /// Codec NONE: a packet that is there, but holds no sound.
    void put(RtpHeader const& header, MG_Rtp::ECodec::Type codec, std::span<unsigned char const> payload)
    {
        m_buffer.put(header, codec, payload);
    }
    /// Fills the frame; false: with silence, for nothing comes.
    bool take(std::span<short> frame);

    JitterBuffer const& getBuffer() const { return m_buffer; }

private:
    bool step();
    bool prepare(MG_Rtp::ECodec::Type codec);
    void decode(JitterBuffer::Slot const& slot);
    void conceal();
    void append(std::size_t samples);

    unsigned int m_rate;
    JitterBuffer m_buffer;
    MG_Rtp::ECodec::Type m_codec = MG_Rtp::ECodec::NONE;
    std::unique_ptr<VoiceDecoder> m_decoder;
    std::unique_ptr<Resampler> m_resampler;
    std::vector<short> m_decoded;
    std::vector<short> m_ready;   // at the rate that is wanted
    std::size_t m_size = 0;       // of what is ready
    std::size_t m_period = 0;     // samples of the packet before, as decoded
    unsigned int m_concealed = 0; // packets in a row
};
