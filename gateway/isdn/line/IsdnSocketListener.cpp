#include "isdn/line/IsdnSocketListener.h"

#include <sys/epoll.h>
#include <sys/socket.h>
#include <sys/un.h>

namespace
{
constexpr int WAITING = 64; // connections that the system keeps for us

bool WATCH(int epoll, int descriptor)
{
    epoll_event event = {};
    event.events = EPOLLIN;
    event.data.fd = descriptor;
    return epoll_ctl(epoll, EPOLL_CTL_ADD, descriptor, &event) == 0;
}
} // namespace

IsdnSocketListener::~IsdnSocketListener()
{
    if (!m_path.empty())
        unlink(m_path.c_str());
}

bool IsdnSocketListener::open(std::string const& path)
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path)
        return false;
    path.copy(address.sun_path, path.size());
    unlink(path.c_str());
    m_socket.reset(socket(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
    m_epoll.reset(epoll_create1(EPOLL_CLOEXEC));
    if (bind(m_socket.get(), reinterpret_cast<sockaddr const*>(&address), sizeof address) != 0)
        return false;
    m_path = path;
    return listen(m_socket.get(), WAITING) == 0 && WATCH(m_epoll.get(), m_socket.get());
}

std::optional<IsdnWires> IsdnSocketListener::accept()
{
    takeConnections();
    for (std::size_t i = 0; i < m_early.size();)
    {
        bool isEarly = false;
        int const descriptor = m_early[i].get();
        std::optional<IsdnWires> wires = IsdnWires::TAKE(m_early[i], isEarly);
        if (isEarly)
        {
            ++i;
            continue;
        }
        epoll_ctl(m_epoll.get(), EPOLL_CTL_DEL, descriptor, nullptr);
        m_early.erase(m_early.begin() + static_cast<std::ptrdiff_t>(i));
        if (wires)
            return wires;
    }
    return std::nullopt;
}

void IsdnSocketListener::takeConnections()
{
    for (;;)
    {
        IsdnDescriptor connection(accept4(m_socket.get(), nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC));
        if (connection.get() < 0)
            return;
        WATCH(m_epoll.get(), connection.get());
        m_early.push_back(std::move(connection));
    }
}
