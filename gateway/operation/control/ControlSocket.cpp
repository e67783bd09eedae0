#include "operation/control/ControlSocket.h"

#include "host/ConnectionGuard.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <grp.h>
#include <stdexcept>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace
{
constexpr int BACKLOG = 64;

sockaddr_un ADDRESS_OF(std::string const& path)
{
    sockaddr_un address = {};
    if (path.size() >= sizeof address.sun_path)
        throw std::runtime_error("the name is too long for a socket");
    address.sun_family = AF_UNIX;
    path.copy(address.sun_path, path.size());
    return address;
}

/// A socket that a process has left when it was killed.
void REMOVE_STALE(std::string const& path, sockaddr_un const& address)
{
    struct stat status = {};
    if (lstat(path.c_str(), &status) != 0)
        return;
    if (!S_ISSOCK(status.st_mode))
        throw std::runtime_error("there is a file of that name, which is no socket");
    int const descriptor = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    bool const isAlive = connect(descriptor, reinterpret_cast<sockaddr const*>(&address), sizeof address) == 0 ||
                         errno == EAGAIN || errno == EACCES;
    close(descriptor);
    if (isAlive)
        throw std::runtime_error("another process listens there");
    unlink(path.c_str());
}

gid_t GROUP_OF(std::string const& name)
{
    group const* const found = name.empty() ? nullptr : getgrnam(name.c_str());
    if (!name.empty() && found == nullptr)
        throw std::runtime_error("there is no group '" + name + "'");
    return found != nullptr ? found->gr_gid : getegid();
}

/// Nobody but its owner may connect before the group and the mode are what they are to be.
bool BIND(int descriptor, sockaddr_un const& address, gid_t group, mode_t mode)
{
    mode_t const before = umask(0177);
    bool const isBound = bind(descriptor, reinterpret_cast<sockaddr const*>(&address), sizeof address) == 0;
    umask(before);
    return isBound && (group == getegid() || chown(address.sun_path, static_cast<uid_t>(-1), group) == 0) &&
           chmod(address.sun_path, mode) == 0 && listen(descriptor, BACKLOG) == 0;
}
} // namespace

ControlSocket::ControlSocket(ControlOptions const& options)
{
    sockaddr_un const address = ADDRESS_OF(options.path);
    gid_t const group = GROUP_OF(options.group);
    REMOVE_STALE(options.path, address);
    m_descriptor = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    if (m_descriptor >= 0 && BIND(m_descriptor, address, group, options.mode))
    {
        m_path = options.path;
        return;
    }
    std::string const reason = std::strerror(errno);
    close(m_descriptor);
    throw std::runtime_error("cannot be listened on: " + reason);
}

ControlSocket::~ControlSocket()
{
    unlink(m_path.c_str());
    close(m_descriptor);
}

/// Through the guard, which knows what to do when there is no descriptor left.
int ControlSocket::accept() const
{
    int const client = ConnectionGuard::ACCEPT(m_descriptor, nullptr, nullptr);
    if (client >= 0)
        fcntl(client, F_SETFL, fcntl(client, F_GETFL) | O_NONBLOCK);
    return client;
}
