#include "media/codec/Resampler.h"

#include <algorithm>
#include <new>

namespace
{
constexpr int QUALITY = 5; // of 0 to 10: the alias lies some 80 dB below
}

Resampler::Resampler(unsigned int from, unsigned int to)
    : m_state(from == to ? nullptr : speex_resampler_init(1, from, to, QUALITY, nullptr), speex_resampler_destroy)
{
    if (m_state == nullptr && from != to)
        throw std::bad_alloc();
}

std::size_t Resampler::convert(std::span<short const> in, std::span<short> out)
{
    if (m_state == nullptr)
    {
        std::size_t const count = std::min(in.size(), out.size());
        std::copy_n(in.begin(), count, out.begin());
        return count;
    }
    auto read = static_cast<spx_uint32_t>(in.size());
    auto written = static_cast<spx_uint32_t>(out.size());
    speex_resampler_process_int(m_state.get(), 0, in.data(), &read, out.data(), &written);
    return written;
}
