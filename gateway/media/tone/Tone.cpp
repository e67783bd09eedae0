#include "media/tone/Tone.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <iterator>
#include <numbers>

namespace
{
constexpr double AMPLITUDE = 5827; // of all frequencies together: 15 dB below the loudest sine

/// The number at the beginning of `text`, which is taken off it: whether there was one.
bool TAKE_NUMBER(std::string_view& text, unsigned int& number)
{
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    text.remove_prefix(static_cast<std::size_t>(end - text.data()));
    return error == std::errc();
}

bool TAKE(std::string_view& text, char character)
{
    bool const isThere = !text.empty() && text.front() == character;
    text.remove_prefix(isThere ? 1 : 0);
    return isThere;
}
} // namespace

bool Tone::add(std::string_view text)
{
    Piece piece;
    std::size_t count = 0;
    do
    {
        unsigned int frequency = 0;
        if (count == piece.frequencies.size() || !TAKE_NUMBER(text, frequency) || frequency >= 4000)
            return false;
        piece.frequencies[count++] = static_cast<unsigned short>(frequency);
    } while (TAKE(text, '+'));
    bool const hasTime = TAKE(text, '/');
    if ((hasTime &&
         (!TAKE_NUMBER(text, piece.milliseconds) || piece.milliseconds == 0 || piece.milliseconds > 3600000)) ||
        !text.empty())
        return false;
    pieces.push_back(piece);
    return true;
}

bool ToneGenerator::goOn(unsigned int rate)
{
    if (m_piece >= m_tone->pieces.size())
        return false;
    unsigned int const milliseconds = m_tone->pieces[m_piece].milliseconds;
    if (milliseconds == 0 || m_passed < milliseconds * std::size_t{rate} / 1000)
        return true;
    m_passed = 0;
    m_phases = {};
    if (++m_piece == m_tone->pieces.size())
        m_piece = m_tone->again;
    return m_piece < m_tone->pieces.size();
}

short ToneGenerator::makeOne(unsigned int rate)
{
    std::array<unsigned short, 4> const& frequencies = m_tone->pieces[m_piece].frequencies;
    auto const voices = std::max<std::ptrdiff_t>(4 - std::count(frequencies.begin(), frequencies.end(), 0), 1);
    double sum = 0;
    for (std::size_t i = 0; i < frequencies.size(); ++i)
    {
        if (frequencies[i] == 0)
            continue;
        sum += std::sin(m_phases[i]);
        m_phases[i] = std::fmod(m_phases[i] + 2 * std::numbers::pi * frequencies[i] / rate, 2 * std::numbers::pi);
    }
    ++m_passed;
    return static_cast<short>(std::lround(sum * AMPLITUDE / static_cast<double>(voices)));
}

bool ToneGenerator::make(std::span<short> samples, unsigned int rate)
{
    bool isPlaying = false;
    for (short& sample : samples)
    {
        bool const goesOn = goOn(rate);
        sample = goesOn ? makeOne(rate) : short{0};
        isPlaying |= goesOn;
    }
    return isPlaying;
}
