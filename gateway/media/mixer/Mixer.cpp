#include "media/mixer/Mixer.h"

#include <algorithm>
#include <limits>
#include <numeric>

void Mixer::begin(std::size_t samples)
{
    m_samples = std::min(samples, LONGEST);
    m_size = m_chosen = 0;
    std::fill_n(m_sum.begin(), m_samples, 0);
}

void Mixer::add(std::span<short const> frame)
{
    if (m_size == MOST)
        return;
    long long const energy = std::accumulate(frame.begin(), frame.end(), 0LL,
                                             [](long long sum, short sample) { return sum + sample * sample; });
    m_parties[m_size++] = {frame, energy, false};
}

bool Mixer::isLouder(std::size_t left, std::size_t right) const
{
    return m_parties[left].energy > m_parties[right].energy;
}

void Mixer::choose()
{
    std::array<std::size_t, MOST> order;
    std::iota(order.begin(), order.begin() + static_cast<std::ptrdiff_t>(m_size), std::size_t{0});
    std::size_t const loudest = std::min(m_size, LOUDEST);
    std::partial_sort(order.begin(), order.begin() + static_cast<std::ptrdiff_t>(loudest),
                      order.begin() + static_cast<std::ptrdiff_t>(m_size),
                      [this](std::size_t left, std::size_t right) { return isLouder(left, right); });
    for (std::size_t i = 0; i < loudest; ++i)
    {
        Party& party = m_parties[order[i]];
        party.isChosen = party.frame.size() >= m_samples && !party.frame.empty();
        if (!party.isChosen)
            continue;
        ++m_chosen;
        for (std::size_t sample = 0; sample < m_samples; ++sample)
            m_sum[sample] += party.frame[sample];
    }
}

bool Mixer::get(std::size_t party, std::span<short> frame) const
{
    bool const isHeard = party < m_size && m_parties[party].isChosen;
    std::size_t const count = std::min(frame.size(), m_samples);
    for (std::size_t sample = 0; sample < count; ++sample)
    {
        int const others = m_sum[sample] - (isHeard ? m_parties[party].frame[sample] : 0);
        frame[sample] = static_cast<short>(
            std::clamp<int>(others, std::numeric_limits<short>::min(), std::numeric_limits<short>::max()));
    }
    return m_chosen > (isHeard ? 1u : 0u);
}
