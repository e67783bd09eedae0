#include "media/codec/L16Codec.h"

std::size_t L16Decoder::decode(std::span<unsigned char const> payload, std::span<short> samples)
{
    std::size_t const count = payload.size() / 2;
    if (payload.size() % 2 != 0 || count > samples.size())
        return 0;
    for (std::size_t i = 0; i < count; ++i)
        samples[i] = static_cast<short>(payload[2 * i] << 8 | payload[2 * i + 1]);
    m_concealment.note(samples.first(count));
    return count;
}

std::size_t L16Encoder::encode(std::span<short const> samples, std::span<unsigned char> payload)
{
    if (2 * samples.size() > payload.size())
        return 0;
    for (std::size_t i = 0; i < samples.size(); ++i)
    {
        payload[2 * i] = static_cast<unsigned char>(samples[i] >> 8);
        payload[2 * i + 1] = static_cast<unsigned char>(samples[i]);
    }
    return 2 * samples.size();
}
