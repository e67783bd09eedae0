#pragma once

#include "configuration/SocketAddress.h"

/// Where the gateway's figures are to be had.
struct MetricOptions
{
    SocketAddress listen; ///< a loopback address; port 0: nowhere
    bool hasPage = false; ///< for browsers, with numbers

    friend bool operator==(MetricOptions const&, MetricOptions const&) = default;
};
