#include "configuration/AddressRange.h"

#include <algorithm>
#include <arpa/inet.h>
#include <charconv>
#include <netinet/in.h>
#include <stdexcept>
#include <string_view>
#include <system_error>

namespace
{
constexpr unsigned int BITS_OF_MAPPED = 96; // that an address of version 4 has in front of its own 32

constexpr InternetAddress MAPPED = {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 0, 0, 0, 0};

unsigned int PARSE_BITS(std::string const& text, unsigned int most)
{
    unsigned int bits = 0;
    auto const [stop, error] = std::from_chars(text.data(), text.data() + text.size(), bits);
    if (error != std::errc() || stop != text.data() + text.size() || bits > most)
        throw std::invalid_argument("'" + text + "' is not the length of a prefix");
    return bits;
}

/// The octet's bits that lie beyond a prefix.
constexpr unsigned int BEYOND(unsigned int bits, std::size_t octet)
{
    unsigned int const before = static_cast<unsigned int>(octet) * 8;
    return bits >= before + 8 ? 0 : bits <= before ? 0xff : 0xffu >> (bits - before);
}
} // namespace

AddressRange AddressRange::PARSE(std::string const& text)
{
    std::size_t const slash = text.find('/');
    std::string const host = text.substr(0, slash);
    AddressRange range;
    bool const isVersion4 = inet_pton(AF_INET, host.c_str(), MAPPED.size() - 4 + range.m_first.data()) == 1;
    if (isVersion4)
        std::copy_n(MAPPED.begin(), MAPPED.size() - 4, range.m_first.begin());
    else if (inet_pton(AF_INET6, host.c_str(), range.m_first.data()) != 1)
        throw std::invalid_argument("'" + host + "' is not an address");
    if (slash == std::string::npos)
        return range;
    std::string const prefix = text.substr(slash + 1);
    range.m_bits = isVersion4 ? BITS_OF_MAPPED + PARSE_BITS(prefix, 32) : PARSE_BITS(prefix, 128);
    for (std::size_t i = 0; i < range.m_first.size(); ++i)
        if ((range.m_first[i] & BEYOND(range.m_bits, i)) != 0)
            throw std::invalid_argument("'" + text + "' has bits beyond its prefix");
    return range;
}

std::string AddressRange::TEXT_OF(InternetAddress const& address)
{
    constexpr std::string_view WRITTEN = "::ffff:";
    char text[INET6_ADDRSTRLEN] = "";
    inet_ntop(AF_INET6, address.data(), text, sizeof text);
    std::string_view const whole = text;
    return std::string(whole.starts_with(WRITTEN) ? whole.substr(WRITTEN.size()) : whole);
}

InternetAddress AddressRange::ADDRESS_OF(sockaddr const& address)
{
    InternetAddress result = {};
    if (address.sa_family == AF_INET6)
    {
        auto const& source = reinterpret_cast<sockaddr_in6 const&>(address);
        std::copy_n(source.sin6_addr.s6_addr, result.size(), result.begin());
    }
    else if (address.sa_family == AF_INET)
    {
        auto const& source = reinterpret_cast<sockaddr_in const&>(address);
        auto const* const octets = reinterpret_cast<unsigned char const*>(&source.sin_addr);
        result = MAPPED;
        std::copy_n(octets, 4, result.end() - 4);
    }
    return result;
}

bool AddressRange::contains(InternetAddress const& address) const
{
    for (std::size_t i = 0; i < address.size(); ++i)
        if (((address[i] ^ m_first[i]) & ~BEYOND(m_bits, i) & 0xff) != 0)
            return false;
    return true;
}

bool AddressRange::CONTAINS(std::vector<AddressRange> const& ranges, InternetAddress const& address)
{
    return std::any_of(ranges.begin(), ranges.end(),
                       [&](AddressRange const& range) { return range.contains(address); });
}
