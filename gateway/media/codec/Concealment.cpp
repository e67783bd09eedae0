#include "media/codec/Concealment.h"

#include <algorithm>
#include <cmath>

/// The period, 2.5 to 15 ms, by which the newest 20 ms resemble what was before them most.
std::size_t Concealment::findPitch() const
{
    std::size_t const window = m_rate / 50;
    short const* const newest = m_history.data() + m_history.size() - window;
    std::size_t best = m_rate / 400;
    double highest = -1;
    for (std::size_t period = best; period <= m_rate * 3 / 200; ++period)
    {
        double product = 0;
        double energy = 1;
        for (std::size_t i = 0; i < window; ++i)
        {
            double const before = *(newest + i - period);
            product += newest[i] * before;
            energy += before * before;
        }
        double const likeness = product / std::sqrt(energy);
        if (likeness > highest)
            highest = likeness, best = period;
    }
    return best;
}

/// The next sample of the repetition.
double Concealment::repeat()
{
    double const gain = std::max(1 - static_cast<double>(m_filled) / (0.06 * m_rate), 0.0);
    return gain * m_history[m_history.size() - m_pitch + m_filled++ % m_pitch];
}

void Concealment::fill(std::span<short> samples)
{
    if (m_pitch == 0)
    {
        m_pitch = findPitch();
        m_filled = 0;
    }
    for (short& sample : samples)
        sample = static_cast<short>(std::lround(repeat()));
}

void Concealment::note(std::span<short> samples)
{
    std::size_t const blended = m_pitch == 0 ? 0 : std::min<std::size_t>(samples.size(), m_rate / 200);
    for (std::size_t i = 0; i < blended; ++i)
    {
        double const weight = static_cast<double>(i) / static_cast<double>(blended);
        samples[i] = static_cast<short>(std::lround(weight * samples[i] + (1 - weight) * repeat()));
    }
    m_pitch = 0;
    remember(samples);
}

void Concealment::remember(std::span<short const> samples)
{
    std::size_t const count = std::min(samples.size(), m_history.size());
    std::copy(m_history.begin() + static_cast<std::ptrdiff_t>(count), m_history.end(), m_history.begin());
    std::copy(samples.end() - static_cast<std::ptrdiff_t>(count), samples.end(),
              m_history.end() - static_cast<std::ptrdiff_t>(count));
}
