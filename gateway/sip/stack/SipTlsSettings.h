#pragma once

#include <stdexcept>
#include <string>
#include <vector>

/// What an interface needs for TLS. A plain value; README.md lists the keys.
struct SipTlsSettings
{
    /// What is demanded of the other end's certificate.
    enum Check : unsigned char
    {
        OFF,  ///< nothing; who connects to us need not have one
        PEER, ///< that one of `authorities` has issued it, and that it has not expired
        NAME  ///< that it is of one of `names` besides, or, if there are none, of the other end's address
    };

    std::string certificate; ///< files in the form PEM: ours, and what leads from it to its authority
    std::string key;
    std::string authorities; ///< empty: none
    Check ofServers = NAME;  ///< to whom we connect
    Check ofClients = NAME;  ///< who connects to us
    std::vector<std::string> names;
    bool isLeast13 = false; ///< TLS 1.3 and nothing else; else 1.2 too

    /// What cannot be used, with the key of the configuration.
    struct Failure : std::runtime_error
    {
        Failure(char const* k, std::string const& reason) : std::runtime_error(reason), key(k) {}
        char const* key;
    };
};
