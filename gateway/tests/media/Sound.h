#pragma once

#include <algorithm>
#include <cmath>
#include <numbers>
#include <random>
#include <span>
#include <vector>

/// Sounds for tests, and what is to be found in them.
namespace Sound
{
inline std::vector<short> SINE(double frequency, unsigned int rate, std::size_t samples, double amplitude = 8000)
{
    std::vector<short> made(samples);
    for (std::size_t i = 0; i < samples; ++i)
        made[i] =
            static_cast<short>(std::lround(amplitude * std::sin(2 * std::numbers::pi * frequency *
                                                                static_cast<double>(i) / static_cast<double>(rate))));
    return made;
}

/// Something like a vowel, whose pitch and loudness wander: harmonics of 100 to 140 Hz up to 3 kHz.
inline std::vector<short> VOICE(unsigned int rate, std::size_t samples)
{
    std::vector<short> made(samples);
    double phase = 0;
    for (std::size_t i = 0; i < samples; ++i)
    {
        double const time = static_cast<double>(i) / rate;
        phase += 2 * std::numbers::pi * (120 + 20 * std::sin(3 * time)) / rate;
        double sum = 0;
        for (int harmonic = 1; harmonic <= 20; ++harmonic)
            sum += std::sin(harmonic * phase) / harmonic;
        made[i] = static_cast<short>(std::lround(4000 * (1 + 0.5 * std::sin(7 * time)) * sum));
    }
    return made;
}

/// The amplitude of a frequency (Goertzel).
inline double AMPLITUDE(std::span<short const> samples, double frequency, unsigned int rate)
{
    double const step = 2 * std::numbers::pi * frequency / rate;
    double real = 0;
    double imaginary = 0;
    for (std::size_t i = 0; i < samples.size(); ++i)
    {
        real += samples[i] * std::cos(step * static_cast<double>(i));
        imaginary += samples[i] * std::sin(step * static_cast<double>(i));
    }
    return 2 * std::hypot(real, imaginary) / static_cast<double>(samples.size());
}

/// How far behind `original` the `copy` comes, in samples, at most `most`: where the two resemble each other best.
inline std::size_t DELAY(std::span<short const> original, std::span<short const> copy, std::size_t most)
{
    std::size_t best = 0;
    double highest = 0;
    for (std::size_t delay = 0; delay <= most; ++delay)
    {
        double sum = 0;
        for (std::size_t i = 0; i + delay < copy.size() && i < original.size(); ++i)
            sum += static_cast<double>(original[i]) * copy[i + delay];
        if (sum > highest)
            highest = sum, best = delay;
    }
    return best;
}

/// The mean of the signal-to-noise ratios of pieces of 20 ms, in dB, each between -10 and 35, silent ones left out.
inline double SEGMENTAL_SNR(std::span<short const> original, std::span<short const> copy, unsigned int rate)
{
    std::size_t const piece = rate / 50;
    double sum = 0;
    unsigned int count = 0;
    for (std::size_t at = 0; at + piece <= std::min(original.size(), copy.size()); at += piece)
    {
        double signal = 0;
        double noise = 0;
        for (std::size_t i = at; i < at + piece; ++i)
        {
            signal += static_cast<double>(original[i]) * original[i];
            noise += std::pow(static_cast<double>(original[i]) - copy[i], 2);
        }
        if (signal < 1e4 * static_cast<double>(piece))
            continue;
        sum += std::clamp(10 * std::log10(signal / std::max(noise, 1.0)), -10.0, 35.0);
        ++count;
    }
    return count == 0 ? 0 : sum / count;
}
} // namespace Sound
