#pragma once

#include <array>
#include <cstddef>
#include <span>
#include <string_view>
#include <vector>

/// How a tone sounds: pieces of up to four frequencies at once, one after the other, then from the beginning again.
struct Tone
{
    struct Piece
    {
        std::array<unsigned short, 4> frequencies{}; ///< Hz; 0: none. All none: silence
        unsigned int milliseconds = 0;               ///< 0: without end

        friend bool operator==(Piece const&, Piece const&) = default;
    };
    std::vector<Piece> pieces;
    std::size_t again = 0; ///< the piece with which it goes on after the last; as many as there are: it ends

    /// Adds a piece written as "425/480", "350+440/2000", "0/480" (silence) or "425" (without end): whether it is one.
    bool add(std::string_view piece);

    friend bool operator==(Tone const&, Tone const&) = default;
};

/// Makes a tone's sound. The tone must outlive it.
class ToneGenerator
{
public:
    explicit ToneGenerator(Tone const& tone) : m_tone(&tone) {}

    /// The next samples at that rate in Hz, the same each time. False: it has ended, and they are silence.
    bool make(std::span<short> samples, unsigned int rate);

private:
    bool goOn(unsigned int rate);
    short makeOne(unsigned int rate);

    Tone const* m_tone;
    std::size_t m_piece = 0;
    std::size_t m_passed = 0; // samples of the piece
    std::array<double, 4> m_phases{};
};
