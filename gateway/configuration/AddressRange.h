#pragma once

#include <array>
#include <string>
#include <vector>

struct sockaddr;

/// An address of the internet in its 16 octets, whatever its version: one of version 4 as version 6 maps it.
using InternetAddress = std::array<unsigned char, 16>;

/// Addresses that begin alike, as a configuration writes them: "192.0.2.0/24", "2001:db8::/32", or an address alone. A
/// plain value.
///
///     if (AddressRange::PARSE("192.0.2.0/24").contains(AddressRange::ADDRESS_OF(from)))
///         ...
class AddressRange
{
public:
    /// Throws std::invalid_argument with the reason for anything else, and for octets beyond the prefix that are not 0:
    /// whoever writes "192.0.2.1/24" means one thing or the other.
    static AddressRange PARSE(std::string const& text);
    /// All zeros for what is no address of the internet, which only the range of everything contains.
    static InternetAddress ADDRESS_OF(sockaddr const& address);
    /// "192.0.2.1", "2001:db8::1".
    static std::string TEXT_OF(InternetAddress const& address);

    InternetAddress const& getFirst() const { return m_first; }
    bool contains(InternetAddress const& address) const;
    /// Whether one of them does.
    static bool CONTAINS(std::vector<AddressRange> const& ranges, InternetAddress const& address);

private:
    InternetAddress m_first = {};
    unsigned int m_bits = 128; // of the prefix
};
