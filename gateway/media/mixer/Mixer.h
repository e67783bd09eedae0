#pragma once

#include <array>
#include <cstddef>
#include <span>

/// What each party of a conference hears: the three loudest of the others, for more are only noise; whoever is among
/// the three does not hear himself.
///
///     mixer.begin(160);
///     mixer.add(frameOfA), mixer.add(frameOfB), mixer.add(frameOfC);
///     mixer.choose();
///     mixer.get(0, frame); // for A
class Mixer
{
public:
    static constexpr std::size_t MOST = 32; ///< parties; what further ones say is not heard
    static constexpr std::size_t LOUDEST = 3;
    static constexpr std::size_t LONGEST = 960; ///< samples of a frame: 20 ms at 48 kHz

    /// A new frame of so many samples, at most LONGEST.
    void begin(std::size_t samples);
    /// What the next party says; it must stay until the last `get`. Empty: nothing.
    void add(std::span<short const> frame);
    /// After the last `add`.
    void choose();
    /// What the party hears, in the order of `add`: false, and silence, when nobody else says anything.
    bool get(std::size_t party, std::span<short> frame) const;

private:
    struct Party
    {
        std::span<short const> frame;
        long long energy = 0;
        bool isChosen = false;
    };

    bool isLouder(std::size_t left, std::size_t right) const;

    std::array<Party, MOST> m_parties{};
    std::size_t m_size = 0;
    std::size_t m_samples = 0;
    std::size_t m_chosen = 0;
    std::array<int, LONGEST> m_sum{};
};
