#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"

#include <array>

namespace TY
{
/// A universally unique identifier of 16 octets (RFC 4122).
class CC_EXPORT UUID
{
public:
    /// In the order in which they are written.
    using Octets = std::array<unsigned char, 16>;

    UUID() = default; ///< the invalid one
    /// Any 16 octets; version and variant are not looked at.
    explicit UUID(Octets const& octets) : m_octets(octets) {}

    /// The identifier that names nothing: all octets 0.
    static UUID const& INVALID();

    /// Whether it names something: an octet is not 0.
    bool isValid() const { return !(*this == INVALID()); }
    /// "00112233-4455-6677-8899-aabbccddeeff"
    String getString() const;
    /// Octet by octet.
    friend bool operator==(UUID const&, UUID const&) = default;

private:
    Octets m_octets{};
};
} // namespace TY
