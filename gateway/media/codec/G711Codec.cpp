#include "media/codec/G711Codec.h"

#include <algorithm>
#include <spandsp.h>

std::size_t G711Decoder::decode(std::span<unsigned char const> payload, std::span<short> samples)
{
    if (payload.size() > samples.size())
        return 0;
    std::transform(payload.begin(), payload.end(), samples.begin(),
                   [this](unsigned char octet) { return m_isALaw ? alaw_to_linear(octet) : ulaw_to_linear(octet); });
    m_concealment.note(samples.first(payload.size()));
    return payload.size();
}

std::size_t G711Encoder::encode(std::span<short const> samples, std::span<unsigned char> payload)
{
    if (samples.size() > payload.size())
        return 0;
    std::transform(samples.begin(), samples.end(), payload.begin(),
                   [this](short sample) { return m_isALaw ? linear_to_alaw(sample) : linear_to_ulaw(sample); });
    return samples.size();
}
