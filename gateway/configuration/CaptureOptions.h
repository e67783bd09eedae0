#pragma once

#include "configuration/SocketAddress.h"

#include <string>

/// Who is shown the messages that go over the wire.
struct CaptureOptions
{
    SocketAddress server; ///< port 0: nobody
    unsigned int id = 1;  ///< of this gateway, for the server
    std::string password; ///< that the server knows it by; empty: none

    bool isOn() const { return server.port != 0; }

    friend bool operator==(CaptureOptions const&, CaptureOptions const&) = default;
};
