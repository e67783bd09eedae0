#include "media/file/WaveFile.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <fcntl.h>

namespace
{
constexpr std::size_t LARGEST = 64u << 20; // octets
constexpr std::size_t HEADER = 44;
constexpr unsigned int LINEAR = 1;
constexpr unsigned int BITS = 16;

unsigned int LITTLE(std::span<unsigned char const> octets, std::size_t at, std::size_t length)
{
    unsigned int value = 0;
    for (std::size_t i = length; i > 0; --i)
        value = value << 8 | octets[at + i - 1];
    return value;
}

void PUT(unsigned char* to, std::size_t length, std::size_t value)
{
    for (std::size_t i = 0; i < length; ++i, value >>= 8)
        to[i] = static_cast<unsigned char>(value);
}

bool IS(std::span<unsigned char const> octets, std::size_t at, char const (&name)[5])
{
    return std::memcmp(&octets[at], name, 4) == 0;
}

std::array<unsigned char, HEADER> MAKE_HEADER(unsigned int rate, unsigned int channels, std::size_t octets)
{
    std::array<unsigned char, HEADER> header;
    std::memcpy(header.data(), "RIFF....WAVEfmt ....................data....", HEADER);
    PUT(&header[4], 4, HEADER - 8 + octets);
    PUT(&header[16], 4, 16);
    PUT(&header[20], 2, LINEAR);
    PUT(&header[22], 2, channels);
    PUT(&header[24], 4, rate);
    PUT(&header[28], 4, std::size_t{rate} * channels * BITS / 8);
    PUT(&header[32], 2, channels * BITS / 8);
    PUT(&header[34], 2, BITS);
    PUT(&header[40], 4, octets);
    return header;
}
} // namespace

bool WaveReader::read(std::string const& path)
{
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> const file(std::fopen(path.c_str(), "rb"), std::fclose);
    if (file == nullptr)
        return false;
    std::vector<unsigned char> octets;
    std::array<unsigned char, 65536> block;
    for (std::size_t count = 1; count != 0 && octets.size() <= LARGEST;)
    {
        count = std::fread(block.data(), 1, block.size(), file.get());
        octets.insert(octets.end(), block.begin(), block.begin() + static_cast<std::ptrdiff_t>(count));
    }
    return octets.size() <= LARGEST && read(octets);
}

bool WaveReader::read(std::span<unsigned char const> octets)
{
    *this = WaveReader();
    if (octets.size() < 12 || !IS(octets, 0, "RIFF") || !IS(octets, 8, "WAVE"))
        return false;
    for (std::size_t at = 12; octets.size() - at >= 8;)
    {
        std::size_t const length = std::min<std::size_t>(LITTLE(octets, at + 4, 4), octets.size() - at - 8);
        std::span<unsigned char const> const chunk = octets.subspan(at + 8, length);
        if (IS(octets, at, "fmt ") && !readFormat(chunk))
            return false;
        if (IS(octets, at, "data") && m_rate != 0)
            return readSamples(chunk), true;
        at = std::min(at + 8 + length + length % 2, octets.size());
    }
    return false;
}

bool WaveReader::readFormat(std::span<unsigned char const> chunk)
{
    if (chunk.size() < 16 || LITTLE(chunk, 0, 2) != LINEAR || LITTLE(chunk, 14, 2) != BITS)
        return false;
    m_channels = LITTLE(chunk, 2, 2);
    m_rate = LITTLE(chunk, 4, 4);
    return m_channels >= 1 && m_channels <= 8 && m_rate >= 4000 && m_rate <= 192000;
}

void WaveReader::readSamples(std::span<unsigned char const> chunk)
{
    std::size_t const frame = 2u * m_channels;
    m_samples.reserve(chunk.size() / frame);
    for (std::size_t at = 0; at + frame <= chunk.size(); at += frame)
    {
        int sum = 0;
        for (std::size_t channel = 0; channel < m_channels; ++channel)
            sum += static_cast<short>(LITTLE(chunk, at + 2 * channel, 2));
        m_samples.push_back(static_cast<short>(sum / static_cast<int>(m_channels)));
    }
}

WaveWriter::~WaveWriter() { flush(); }

bool WaveWriter::open(std::string const& path, unsigned int rate, unsigned int channels)
{
    flush();
    int const file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    m_file.reset(file >= 0 ? fdopen(file, "wb") : nullptr);
    m_rate = rate;
    m_channels = channels;
    m_octets = 0;
    return flush();
}

bool WaveWriter::write(std::span<short const> samples)
{
    if (m_file == nullptr)
        return false;
    for (short const sample : samples)
    {
        std::fputc(sample & 0xff, m_file.get());
        std::fputc(sample >> 8 & 0xff, m_file.get());
    }
    m_octets += 2 * samples.size();
    return std::ferror(m_file.get()) == 0;
}

bool WaveWriter::flush()
{
    if (m_file == nullptr)
        return false;
    std::array<unsigned char, HEADER> const header = MAKE_HEADER(m_rate, m_channels, m_octets);
    bool const isWritten = std::fseek(m_file.get(), 0, SEEK_SET) == 0 &&
                           std::fwrite(header.data(), 1, header.size(), m_file.get()) == header.size() &&
                           std::fseek(m_file.get(), 0, SEEK_END) == 0;
    return isWritten && std::fflush(m_file.get()) == 0;
}
