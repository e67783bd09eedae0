#pragma once

#include <cstdint>
#include <string>

/// An address of the internet and a port, as a configuration writes it: "192.0.2.1:5060" or "[2001:db8::1]:5060".
struct SocketAddress
{
    std::string host; ///< an address, never a name; version 6 without its brackets
    std::uint16_t port = 0;

    bool isVersion6() const { return host.find(':') != std::string::npos; }
    bool isUnspecified() const; ///< "0.0.0.0" or "[::]": every address of the host
    bool isMulticast() const;
    friend bool operator==(SocketAddress const&, SocketAddress const&) = default;
    /// The form above.
    std::string text() const;
    /// Throws std::invalid_argument with the reason for anything else, port 0 included.
    static SocketAddress PARSE(std::string const& text);
};
