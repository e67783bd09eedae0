#include "media/codec/G722Codec.h"

std::size_t G722Decoder::decode(std::span<unsigned char const> payload, std::span<short> samples)
{
    if (2 * payload.size() > samples.size())
        return 0;
    int const count = g722_decode(m_state.get(), samples.data(), payload.data(), static_cast<int>(payload.size()));
    m_concealment.note(samples.first(static_cast<std::size_t>(count)));
    return static_cast<std::size_t>(count);
}

std::size_t G722Encoder::encode(std::span<short const> samples, std::span<unsigned char> payload)
{
    if (samples.size() > 2 * payload.size())
        return 0;
    return static_cast<std::size_t>(
        g722_encode(m_state.get(), payload.data(), samples.data(), static_cast<int>(samples.size())));
}
