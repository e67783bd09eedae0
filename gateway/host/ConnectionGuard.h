#pragma once

#include "configuration/AddressRange.h"
#include "configuration/SocketAddress.h"

#include <cstddef>
#include <sys/socket.h>
#include <vector>

/// Which connections a listening stream socket of this process takes: those of the sources that it serves, and so many
/// of each. All others end at once, and are counted. When the process has no descriptor left, the connections that wait
/// are ended too, whoever's they are: else they would wake their loop again and again.
///
///     ConnectionGuard const guard(listen, allow, 16); // for as long as somebody accepts on `listen`
///
/// Whoever calls accept() in this process asks the guards, since this library defines it in the system's place; so
/// stacks do that have no place to ask. On the signalling thread.
class ConnectionGuard
{
public:
    ConnectionGuard(SocketAddress listen, std::vector<AddressRange> allow, std::size_t maxPerSource);
    ~ConnectionGuard();
    ConnectionGuard(ConnectionGuard const&) = delete;
    ConnectionGuard& operator=(ConnectionGuard const&) = delete;

    unsigned long long getNumberOfRefused() const { return m_refused; }

    /// What accept() does. -1 with errno 0 for a connection that was refused.
    static int ACCEPT(int listening, sockaddr* from, socklen_t* length);
    /// How often it was called: that the linker has it called is to be seen.
    static unsigned long long GET_NUMBER_OF_CALLS();

private:
    bool takes(int descriptor) const;
    static ConnectionGuard* FIND(int listening);

    SocketAddress m_listen;
    std::vector<AddressRange> m_allow;
    std::size_t m_maxPerSource;
    unsigned long long m_refused = 0;
};
