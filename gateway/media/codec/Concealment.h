#pragma once

#include <cstddef>
#include <span>
#include <vector>

/// Fills gaps in decoded sound for codecs that have no way of their own: the last pitch period is repeated and fades
/// out within 60 ms, and what comes after the gap is blended in (after ITU-T G.711, appendix I, without its delay).
class Concealment
{
public:
    /// `rate`: of the sound, in Hz. Throws std::bad_alloc.
    explicit Concealment(unsigned int rate) : m_rate(rate), m_history(rate / 25) {}

    /// Sound that came; its beginning is blended with what filled a gap before it.
    void note(std::span<short> samples);
    /// Fills a gap, or one more piece of it.
    void fill(std::span<short> samples);

private:
    std::size_t findPitch() const;
    double repeat();
    void remember(std::span<short const> samples);

    unsigned int m_rate;
    std::vector<short> m_history; // 40 ms
    std::size_t m_pitch = 0;      // samples of a period; 0: there is no gap
    std::size_t m_filled = 0;     // samples of the gap
};
