#pragma once

#include <string>
#include <sys/types.h>

/// Where and for whom the gateway listens for its operators.
struct ControlOptions
{
    std::string path; ///< of the socket; empty: none
    mode_t mode = 0600;
    std::string group; ///< empty: that of the process
    unsigned int maxClients = 16;
    unsigned int idle = 60; ///< seconds after which a client that asks nothing is closed

    friend bool operator==(ControlOptions const&, ControlOptions const&) = default;
};
