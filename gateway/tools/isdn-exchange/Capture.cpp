#include "Capture.h"

#include <cstdint>
#include <sys/time.h>
#include <vector>

namespace
{
constexpr std::uint32_t MAGIC = 0xa1b2c3d4;
constexpr std::uint32_t LINUX_LAPD = 177;
constexpr std::uint32_t LONGEST = 65535;
constexpr unsigned char PROTOCOL = 0x30; // LAPD

void PUT(std::vector<unsigned char>& out, std::uint32_t value, unsigned int octets)
{
    while (octets-- > 0)
        out.push_back(static_cast<unsigned char>(value >> (8 * octets)));
}
} // namespace

Capture::~Capture()
{
    if (m_file != nullptr)
        std::fclose(m_file);
}

bool Capture::open(std::string const& file)
{
    m_file = std::fopen(file.c_str(), "wb");
    if (m_file == nullptr)
        return false;
    std::vector<unsigned char> header;
    PUT(header, MAGIC, 4);
    PUT(header, 2, 2); // version 2.4
    PUT(header, 4, 2);
    PUT(header, 0, 4); // of the zone
    PUT(header, 0, 4);
    PUT(header, LONGEST, 4);
    PUT(header, LINUX_LAPD, 4);
    return std::fwrite(header.data(), 1, header.size(), m_file) == header.size();
}

void Capture::write(std::span<unsigned char const> frame, bool isNetworks)
{
    if (m_file == nullptr)
        return;
    timeval now = {};
    gettimeofday(&now, nullptr);
    std::vector<unsigned char> lapd;
    PUT(lapd, isNetworks ? 4 : 0, 2); // sent, or received: as the network sees it
    PUT(lapd, 0, 2);
    PUT(lapd, 1, 2);                  // length of the address,
    PUT(lapd, isNetworks ? 1 : 0, 1); // which says the side: network or user
    PUT(lapd, 0, 4);
    PUT(lapd, 0, 3);
    PUT(lapd, PROTOCOL, 2);
    lapd.insert(lapd.end(), frame.begin(), frame.end());
    std::vector<unsigned char> record;
    PUT(record, static_cast<std::uint32_t>(now.tv_sec), 4);
    PUT(record, static_cast<std::uint32_t>(now.tv_usec), 4);
    PUT(record, static_cast<std::uint32_t>(lapd.size()), 4);
    PUT(record, static_cast<std::uint32_t>(lapd.size()), 4);
    record.insert(record.end(), lapd.begin(), lapd.end());
    std::fwrite(record.data(), 1, record.size(), m_file);
    std::fflush(m_file);
}
