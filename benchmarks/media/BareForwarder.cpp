// The floor of relaying: one thread, epoll, recvmmsg, sendmmsg; nothing is looked at.
//
// Reads lines "far-port-a far-port-b", writes for each "own-port-a own-port-b", then "ready": what comes from one far
// port to its own goes out of the other's own to the other far port. All on 127.0.0.1, until it is killed.
#include <arpa/inet.h>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <sys/epoll.h>
#include <sys/socket.h>
#include <vector>

namespace
{
constexpr unsigned int BATCH = 16;

struct End
{
    int descriptor;
    std::size_t other;
    sockaddr_in far;
};

sockaddr_in LOOPBACK(unsigned int port)
{
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<unsigned short>(port));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return address;
}

End OPEN(unsigned int farPort, std::size_t other)
{
    End end{socket(AF_INET, SOCK_DGRAM | SOCK_NONBLOCK, 0), other, LOOPBACK(farPort)};
    sockaddr_in const any = LOOPBACK(0);
    if (end.descriptor < 0 || bind(end.descriptor, reinterpret_cast<sockaddr const*>(&any), sizeof any) != 0)
        std::abort();
    return end;
}

unsigned int PORT_OF(End const& end)
{
    sockaddr_in address{};
    socklen_t length = sizeof address;
    getsockname(end.descriptor, reinterpret_cast<sockaddr*>(&address), &length);
    return ntohs(address.sin_port);
}

class Forwarder
{
public:
    Forwarder()
    {
        for (unsigned int i = 0; i < BATCH; ++i)
        {
            m_messages[i].msg_hdr.msg_iov = &m_vectors[i];
            m_messages[i].msg_hdr.msg_iovlen = 1;
        }
    }
    void forward(End const& from, End const& to)
    {
        for (unsigned int i = 0; i < BATCH; ++i)
        {
            m_vectors[i] = {m_octets[i].data(), m_octets[i].size()};
            m_messages[i].msg_hdr.msg_name = nullptr;
            m_messages[i].msg_hdr.msg_namelen = 0;
        }
        int const count = recvmmsg(from.descriptor, m_messages.data(), BATCH, 0, nullptr);
        for (unsigned int i = 0; static_cast<int>(i) < count; ++i)
        {
            m_vectors[i].iov_len = m_messages[i].msg_len;
            m_messages[i].msg_hdr.msg_name = const_cast<sockaddr_in*>(&to.far);
            m_messages[i].msg_hdr.msg_namelen = sizeof to.far;
        }
        if (count > 0)
            sendmmsg(to.descriptor, m_messages.data(), static_cast<unsigned int>(count), 0);
    }

private:
    std::array<std::array<unsigned char, 2048>, BATCH> m_octets{};
    std::array<iovec, BATCH> m_vectors{};
    std::array<mmsghdr, BATCH> m_messages{};
};
} // namespace

int main()
{
    std::vector<End> ends;
    unsigned int a = 0;
    unsigned int b = 0;
    while (std::scanf("%u %u", &a, &b) == 2)
    {
        ends.push_back(OPEN(a, ends.size() + 1));
        ends.push_back(OPEN(b, ends.size() - 1));
        std::printf("%u %u\n", PORT_OF(ends[ends.size() - 2]), PORT_OF(ends.back()));
    }
    int const epoll = epoll_create1(0);
    for (std::size_t i = 0; i < ends.size(); ++i)
    {
        epoll_event event{};
        event.events = EPOLLIN;
        event.data.u64 = i;
        epoll_ctl(epoll, EPOLL_CTL_ADD, ends[i].descriptor, &event);
    }
    std::puts("ready");
    std::fflush(stdout);
    Forwarder forwarder;
    std::array<epoll_event, 512> events;
    while (true)
    {
        int const count = epoll_wait(epoll, events.data(), static_cast<int>(events.size()), -1);
        for (int i = 0; i < count; ++i)
        {
            End const& from = ends[events[static_cast<std::size_t>(i)].data.u64];
            forwarder.forward(from, ends[from.other]);
        }
    }
}
