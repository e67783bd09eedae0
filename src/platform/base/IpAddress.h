#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"

#include <array>

/// An internet address of version 4 or 6: of a host, or of a network with its prefix length. A plain value.
///
///     IpAddress address;
///     if (address.setIpAddrAsString("2001:db8::/32").isOk() && address.isNetType())
///         ...
///
/// Every address is one of three: a host ("192.0.2.1", "2001:db8::1"), a network ("10.0.0.0/8", "::/0"; a prefix as
/// long as the address makes the network of that one host, not the host), or unspecified ("0.0.0.0", "::"), which is
/// neither. Broadcast, multicast and loopback addresses count as hosts.
class CC_EXPORT IpAddress
{
public:
    /// Those of an address.
    using Octets = std::array<unsigned char, 16>;

    IpAddress() = default; ///< unspecified, version 4

    /// Which of the three it is; neither when unspecified. @{
    bool isHostType() const;
    bool isNetType() const { return m_prefixLength != NO_PREFIX; }
    /// @}
    /// 4 or 6
    unsigned int getVersion() const { return m_version; }
    /// In network order; version 4 uses the first four, the others are 0.
    Octets const& getOctets() const { return m_octets; }
    /// The prefix length of a network: 0 to 32 bits in version 4, 0 to 128 in version 6. Of any other address the
    /// length of the whole address, 32 or 128.
    unsigned int getPrefixLength() const;

    /// Replaces `out` by the address: version 4 in dotted decimals, version 6 in lower case, without leading zeros,
    /// the longest run of two or more zero groups shortened, an embedded address of version 4 in decimals; "/" and the
    /// prefix length follow the address of a network. Returns `out`. Throws std::bad_alloc when memory is out.
    String& getIpAddrAsString(String& out) const;
    /// Reads an address in the forms above; version 6 in any of its usual spellings. OK, or FAILURE for anything else,
    /// which leaves the value unchanged: decimals with leading zeros, signs, blanks, zone ids, fewer than four
    /// decimals, a prefix beyond the address's length, a network with bits set behind its prefix, text before or after.
    XCode setIpAddrAsString(String const& text);

    /// The same version, octets and kind: a host never equals a network, nor "0.0.0.0" "::".
    friend bool operator==(IpAddress const&, IpAddress const&) = default;

private:
    static constexpr int NO_PREFIX = -1;

    unsigned int getNumberOfBits() const { return m_version == 4 ? 32 : 128; }
    bool hasBitsBehindPrefix() const;

    Octets m_octets{};
    unsigned char m_version = 4;
    int m_prefixLength = NO_PREFIX;
};
