#include "media/codec/VoiceSender.h"

#include <algorithm>

VoiceSender::VoiceSender(unsigned int rate, MG_Rtp::MediaType const& media)
    : m_rate(rate)
    , m_media(media)
    , m_period(VoiceCodec::PERIOD(media.codec, media.packetPeriod))
    , m_encoder(VoiceCodec::MAKE_ENCODER(media.codec, VoiceCodec::RATE_OF(media.codec, rate)))
    , m_resampler(rate, VoiceCodec::RATE_OF(media.codec, rate))
    , m_packet(VoiceCodec::RATE_OF(media.codec, rate) * m_period / 1000)
    , m_samples(VoiceDecoder::MOST_SAMPLES)
    , m_payload(VoiceEncoder::MOST_OCTETS)
{
}

void VoiceSender::add(std::span<short const> frame)
{
    m_size += m_resampler.convert(frame, std::span(m_samples).subspan(m_size));
}

std::span<unsigned char const> VoiceSender::take()
{
    if (m_encoder == nullptr || m_size < m_packet)
        return {};
    std::size_t const length = m_encoder->encode(std::span(m_samples).first(m_packet), m_payload);
    m_size -= m_packet;
    std::copy_n(m_samples.begin() + static_cast<std::ptrdiff_t>(m_packet), m_size, m_samples.begin());
    return std::span(m_payload).first(length);
}
