#include "media/codec/OpusCodec.h"

#include <algorithm>
#include <new>

OpusVoiceDecoder::OpusVoiceDecoder(unsigned int rate)
    : m_state(opus_decoder_create(static_cast<int>(rate), 1, nullptr), opus_decoder_destroy)
{
    if (m_state == nullptr)
        throw std::bad_alloc();
}

std::size_t OpusVoiceDecoder::decode(std::span<unsigned char const> payload, std::span<short> samples)
{
    if (payload.empty())
        return 0; // the library would take it for a loss
    int const count = opus_decode(m_state.get(), payload.data(), static_cast<int>(payload.size()), samples.data(),
                                  static_cast<int>(samples.size()), 0);
    return static_cast<std::size_t>(std::max(count, 0));
}

void OpusVoiceDecoder::conceal(std::span<short> samples)
{
    int const count = opus_decode(m_state.get(), nullptr, 0, samples.data(), static_cast<int>(samples.size()), 0);
    std::fill(samples.begin() + std::max(count, 0), samples.end(), short{0});
}

OpusVoiceEncoder::OpusVoiceEncoder(unsigned int rate)
    : m_state(opus_encoder_create(static_cast<int>(rate), 1, OPUS_APPLICATION_VOIP, nullptr), opus_encoder_destroy)
{
    if (m_state == nullptr)
        throw std::bad_alloc();
    opus_encoder_ctl(m_state.get(), OPUS_SET_COMPLEXITY(5)); // ten costs three times as much and is hardly heard
}

std::size_t OpusVoiceEncoder::encode(std::span<short const> samples, std::span<unsigned char> payload)
{
    int const length = opus_encode(m_state.get(), samples.data(), static_cast<int>(samples.size()), payload.data(),
                                   static_cast<int>(payload.size()));
    return static_cast<std::size_t>(std::max(length, 0));
}
