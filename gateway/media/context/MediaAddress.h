#pragma once

#include "platform/base/IpAddress.h"

#include <string>

/// Where packets come from or go to: an address of version 4 or 6 and a UDP port. A plain value; port 0: nowhere.
///
///     MediaAddress const far = MediaAddress::OF("192.0.2.10", 4000); // from "c=" and "m=" of a session description
struct MediaAddress
{
    IpAddress host;
    unsigned short port = 0;

    /// From an address in text, without brackets; nowhere when that is none.
    static MediaAddress OF(std::string const& host, unsigned short port);
    /// Whether packets can be sent there: neither port nor host is 0.
    bool isSomewhere() const { return port != 0 && host.isHostType(); }
    /// "192.0.2.10:4000", "[2001:db8::1]:4000"
    std::string text() const;

    friend bool operator==(MediaAddress const&, MediaAddress const&) = default;
};
