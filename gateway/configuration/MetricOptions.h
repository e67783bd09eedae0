#pragma once

#include "configuration/SocketAddress.h"

#include <string>

/// Where the gateway's figures are to be had.
struct MetricOptions
{
    SocketAddress listen; ///< a loopback address; port 0: nowhere
    bool hasPage = false; ///< for browsers, with numbers
    std::string token;    ///< of those who may clear calls and block interfaces from there; empty: nobody

    friend bool operator==(MetricOptions const&, MetricOptions const&) = default;
};
