#pragma once

#include <cstdint>
#include <string>

/// An address of the internet and a port, as a configuration writes it: "192.0.2.1:5060" or "[2001:db8::1]:5060"; or a
/// name, where one is allowed.
struct SocketAddress
{
    std::string host; ///< an address, version 6 without its brackets; or a name
    std::uint16_t port = 0;

    bool isVersion6() const { return host.find(':') != std::string::npos; }
    bool isName() const;        ///< neither an address nor nothing
    bool isUnspecified() const; ///< "0.0.0.0" or "[::]": every address of the host
    bool isMulticast() const;
    friend bool operator==(SocketAddress const&, SocketAddress const&) = default;
    /// The form above; of port 0 the host alone.
    std::string text() const;
    /// Throws std::invalid_argument with the reason for anything else, port 0 included.
    static SocketAddress PARSE(std::string const& text);
    /// The same, or a name with a port, "sip.example:5060", or without.
    static SocketAddress PARSE_NAMED(std::string const& text);
};
