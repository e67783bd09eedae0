#pragma once

#include <memory>
#include <span>
#include <speex/speex_resampler.h>

/// Turns sound sampled at one rate into sound sampled at another. At the same rate it hands it through.
class Resampler
{
public:
    /// Rates in Hz. Throws std::bad_alloc without memory.
    Resampler(unsigned int from, unsigned int to);

    /// What comes out of `in`, at most `out`: how many samples.
    std::size_t convert(std::span<short const> in, std::span<short> out);

private:
    std::unique_ptr<SpeexResamplerState, void (*)(SpeexResamplerState*)> m_state;
};
