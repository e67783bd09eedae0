#include "host/ConnectionGuard.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <netinet/in.h>
#include <new>
#include <sys/stat.h>
#include <unistd.h>

namespace
{
std::vector<ConnectionGuard*> s_guards;
unsigned long long s_calls = 0;

/// A connection as it was when it came. Nobody tells of its end; but a socket's inode is never that of another.
struct Connection
{
    InternetAddress source;
    ino_t inode = 0; ///< 0: none
};
std::vector<Connection> s_connections; // by descriptor

ino_t INODE_OF(int descriptor)
{
    struct stat status = {};
    return fstat(descriptor, &status) == 0 ? status.st_ino : 0;
}

std::size_t NUMBER_OF_CONNECTIONS(InternetAddress const& source)
{
    std::size_t number = 0;
    for (std::size_t i = 0; i < s_connections.size(); ++i)
    {
        Connection& connection = s_connections[i];
        if (connection.inode == 0 || connection.source != source)
            continue;
        if (INODE_OF(static_cast<int>(i)) == connection.inode)
            ++number;
        else
            connection.inode = 0;
    }
    return number;
}

void CLOSE_AT_ONCE(int descriptor)
{
    linger const none = {1, 0}; // with a reset: nothing of it stays in the system
    setsockopt(descriptor, SOL_SOCKET, SO_LINGER, &none, sizeof none);
    close(descriptor);
}

/// A descriptor kept for the moment at which there is no other. A connection that cannot be taken would stay in its
/// queue and wake the loop again at once, for ever; so it is taken with this one, and closed.
class Spare
{
public:
    Spare() { open(); }
    void refuse(int listening)
    {
        if (m_descriptor >= 0)
            close(m_descriptor);
        m_descriptor = -1;
        if (int const refused = accept4(listening, nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK); refused >= 0)
            CLOSE_AT_ONCE(refused);
        open();
    }

private:
    void open() { m_descriptor = ::open("/dev/null", O_RDONLY | O_CLOEXEC); }
    int m_descriptor = -1;
};

bool IS_AT(SocketAddress const& address, sockaddr_storage const& storage)
{
    std::uint16_t const port = storage.ss_family == AF_INET6 ? reinterpret_cast<sockaddr_in6 const&>(storage).sin6_port
                                                             : reinterpret_cast<sockaddr_in const&>(storage).sin_port;
    return ntohs(port) == address.port && (storage.ss_family == AF_INET6) == address.isVersion6() &&
           AddressRange::ADDRESS_OF(reinterpret_cast<sockaddr const&>(storage)) ==
               AddressRange::PARSE(address.host).getFirst();
}
} // namespace

ConnectionGuard::ConnectionGuard(SocketAddress listen, std::vector<AddressRange> allow, std::size_t maxPerSource)
    : m_listen(std::move(listen)), m_allow(std::move(allow)), m_maxPerSource(maxPerSource)
{
    s_guards.push_back(this);
}

ConnectionGuard::~ConnectionGuard() { std::erase(s_guards, this); }

unsigned long long ConnectionGuard::GET_NUMBER_OF_CALLS() { return s_calls; }

ConnectionGuard* ConnectionGuard::FIND(int listening)
{
    sockaddr_storage local = {};
    socklen_t length = sizeof local;
    if (getsockname(listening, reinterpret_cast<sockaddr*>(&local), &length) != 0)
        return nullptr;
    auto const found = std::find_if(s_guards.begin(), s_guards.end(),
                                    [&](ConnectionGuard* guard) { return IS_AT(guard->m_listen, local); });
    return found != s_guards.end() ? *found : nullptr;
}

int ConnectionGuard::ACCEPT(int listening, sockaddr* from, socklen_t* length)
{
    static Spare s_spare;
    ++s_calls;
    int const descriptor = accept4(listening, from, length, SOCK_CLOEXEC);
    ConnectionGuard* const guard = FIND(listening);
    if (descriptor < 0)
    {
        if (errno == EMFILE || errno == ENFILE)
        {
            s_spare.refuse(listening);
            if (guard != nullptr)
                ++guard->m_refused;
            errno = 0; // nothing that the caller should do something about
        }
        return -1;
    }
    if (guard == nullptr || guard->takes(descriptor))
        return descriptor;
    CLOSE_AT_ONCE(descriptor);
    ++guard->m_refused;
    errno = 0;
    return -1;
}

bool ConnectionGuard::takes(int descriptor) const
{
    sockaddr_storage from = {};
    socklen_t length = sizeof from;
    if (getpeername(descriptor, reinterpret_cast<sockaddr*>(&from), &length) != 0)
        return false; // gone already
    InternetAddress const source = AddressRange::ADDRESS_OF(reinterpret_cast<sockaddr const&>(from));
    auto const index = static_cast<std::size_t>(descriptor);
    if (!AddressRange::CONTAINS(m_allow, source) || NUMBER_OF_CONNECTIONS(source) >= m_maxPerSource)
        return false;
    try
    {
        if (s_connections.size() <= index)
            s_connections.resize(index + 1);
        s_connections[index] = {source, INODE_OF(descriptor)};
        return true;
    }
    catch (std::bad_alloc const&)
    {
        return false;
    }
}

/// In the system's place.
extern "C" __attribute__((visibility("default"))) int accept(int listening, sockaddr* from, socklen_t* length)
{
    return ConnectionGuard::ACCEPT(listening, from, length);
}
