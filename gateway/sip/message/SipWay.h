#pragma once

/// How a request gets to its peer. SIPS is TLS that is asked for on every hop, by a sips URI (RFC 3261, 26.2.2).
struct SipWay
{
    enum Way : unsigned char
    {
        UDP,
        TCP,
        TLS,
        SIPS,
        AS_NAMED ///< to a peer alone: what the name server says of its name (RFC 3263, 4.1); no dialog is of it
    };
    static constexpr unsigned int NUMBER = SIPS + 1;

    static constexpr bool IS_SECURED(Way way) { return way == TLS || way == SIPS; }
};
