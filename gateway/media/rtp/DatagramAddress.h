#pragma once

#include "media/context/MediaAddress.h"

#include <cstring>
#include <netinet/in.h>

/// A MediaAddress as the system's calls take it. Port 0: nowhere.
struct DatagramAddress
{
    union
    {
        sockaddr any;
        sockaddr_in version4;
        sockaddr_in6 version6;
    };
    socklen_t length = 0;

    DatagramAddress() : version6() {}
    explicit DatagramAddress(MediaAddress const& address);

    bool isSomewhere() const { return length != 0 && getPort() != 0; }
    unsigned short getPort() const { return ntohs(version4.sin_port); } // at the same place in both versions
    void setPort(unsigned short port) { version4.sin_port = htons(port); }
    MediaAddress get() const;
    /// The same host, whatever the port.
    bool hasSameHost(DatagramAddress const& other) const
    {
        if (any.sa_family != other.any.sa_family)
            return false;
        return any.sa_family == AF_INET
                   ? version4.sin_addr.s_addr == other.version4.sin_addr.s_addr
                   : std::memcmp(&version6.sin6_addr, &other.version6.sin6_addr, sizeof version6.sin6_addr) == 0;
    }
    friend bool operator==(DatagramAddress const& left, DatagramAddress const& right)
    {
        return left.version4.sin_port == right.version4.sin_port && left.hasSameHost(right);
    }
};
