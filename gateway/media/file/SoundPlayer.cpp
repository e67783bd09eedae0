#include "media/file/SoundPlayer.h"

#include <algorithm>

SoundPlayer::SoundPlayer(SharedSound const& sound, bool isEndless, unsigned int rate)
    : m_sound(sound), m_isEndless(isEndless), m_rate(rate), m_resampler(sound->rate, rate)
{
}

bool SoundPlayer::take(std::span<short> frame)
{
    std::fill(frame.begin(), frame.end(), short{0});
    std::size_t filled = 0;
    std::span<short const> const samples = m_sound->samples;
    while (filled < frame.size() && !samples.empty())
    {
        if (m_at == samples.size() && !m_isEndless)
            break;
        m_at %= samples.size();
        std::size_t const missing = (frame.size() - filled) * m_sound->rate / m_rate;
        std::size_t const count = std::min(std::max<std::size_t>(missing, 1), samples.size() - m_at);
        filled += m_resampler.convert(samples.subspan(m_at, count), frame.subspan(filled));
        m_at += count;
    }
    return filled != 0;
}
