#pragma once

#include "media/file/RecordedSound.h"

#include <cstdio>
#include <memory>
#include <span>
#include <string>
#include <vector>

/// Linear sound in a file (RIFF WAVE, 16 bits). @{

/// Reads a whole file: announcements and music are short.
class WaveReader
{
public:
    /// Whether it could be read: a file of that kind, up to 64 MB. Several channels become one.
    bool read(std::string const& path);
    /// As above, of what stands in memory.
    bool read(std::span<unsigned char const> octets);

    unsigned int getRate() const { return m_rate; } ///< Hz
    std::vector<short> const& getSamples() const { return m_samples; }
    /// For `LegMedia::playSound`.
    SharedSound share() const { return std::make_shared<RecordedSound const>(RecordedSound{m_rate, m_samples}); }

private:
    bool readFormat(std::span<unsigned char const> chunk);
    void readSamples(std::span<unsigned char const> chunk);

    unsigned int m_rate = 0;
    unsigned int m_channels = 0;
    std::vector<short> m_samples;
};

/// Writes a file as it comes. Its header is right at each `flush()` and at the end, so that a process that is killed
/// leaves what can be played.
class WaveWriter
{
public:
    ~WaveWriter();
    /// Whether the file could be made; one of that name is replaced, a new one is its owner's
    /// alone. `rate`: Hz.
    bool open(std::string const& path, unsigned int rate, unsigned int channels = 1);
    /// Whether it could be written; of several channels their samples in turn.
    bool write(std::span<short const> samples);
    bool flush();

private:
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> m_file{nullptr, std::fclose};
    unsigned int m_rate = 0;
    unsigned int m_channels = 1;
    std::size_t m_octets = 0; // of samples
};
/// @}
