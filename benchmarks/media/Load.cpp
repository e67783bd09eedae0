// Speech for a relay: each end sends 50 packets of 172 octets a second, and says what became of them.
//
//   media_load SECONDS    reads lines "own-port relay-port", one for each end, until the end of its input
//
// Writes "sent N received N lost N p50 US p99 US p999 US" (delay from an end through the relay to the other, in
// microseconds). Ends are spread evenly over the 20 ms. All on 127.0.0.1.
#include <algorithm>
#include <arpa/inet.h>
#include <array>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <sys/epoll.h>
#include <sys/socket.h>
#include <vector>

namespace
{
using Clock = std::chrono::steady_clock;
constexpr std::size_t LENGTH = 172; // octets: a header and 20 ms of G.711
constexpr long SLOTS = 20;          // milliseconds

struct End
{
    int descriptor;
    unsigned short sequence;
    unsigned int timestamp;
    unsigned int source;
};

long long NOW() { return std::chrono::nanoseconds(Clock::now().time_since_epoch()).count(); }

sockaddr_in LOOPBACK(unsigned int port)
{
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<unsigned short>(port));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return address;
}

End OPEN(unsigned int own, unsigned int relay, unsigned int source)
{
    End const end{socket(AF_INET, SOCK_DGRAM | SOCK_NONBLOCK, 0), 0, 0, source};
    int const room = 1 << 20;
    setsockopt(end.descriptor, SOL_SOCKET, SO_RCVBUF, &room, sizeof room);
    sockaddr_in const here = LOOPBACK(own);
    sockaddr_in const there = LOOPBACK(relay);
    if (bind(end.descriptor, reinterpret_cast<sockaddr const*>(&here), sizeof here) != 0 ||
        connect(end.descriptor, reinterpret_cast<sockaddr const*>(&there), sizeof there) != 0)
    {
        std::perror("media_load");
        std::exit(2);
    }
    return end;
}

class Load
{
public:
    void add(End const& end) { m_ends.push_back(end); }

    void run(double seconds)
    {
        int const epoll = watch();
        long long const begin = NOW();
        auto const duration = static_cast<long long>(seconds * 1e9);
        long slot = 0;
        for (long long passed = 0; passed < duration + 500000000; passed = NOW() - begin)
        {
            while (passed < duration && slot < passed / 1000000)
                sendSlot(slot++ % SLOTS);
            receive(epoll);
        }
    }

    void print()
    {
        std::sort(m_delays.begin(), m_delays.end());
        std::size_t const received = m_delays.size();
        auto const percentile = [&](double part)
        {
            auto const index = static_cast<std::size_t>(part * static_cast<double>(received));
            return received == 0 ? 0 : m_delays[std::min(index, received - 1)] / 1000;
        };
        std::printf("sent %zu received %zu lost %zu p50 %lld p99 %lld p999 %lld\n", m_sent, received,
                    m_sent - std::min(received, m_sent), percentile(0.5), percentile(0.99), percentile(0.999));
    }

private:
    int watch() const
    {
        int const epoll = epoll_create1(0);
        for (End const& end : m_ends)
        {
            epoll_event event{};
            event.events = EPOLLIN;
            event.data.fd = end.descriptor;
            epoll_ctl(epoll, EPOLL_CTL_ADD, end.descriptor, &event);
        }
        return epoll;
    }

    void sendSlot(long slot)
    {
        for (auto i = static_cast<std::size_t>(slot); i < m_ends.size(); i += SLOTS)
            send(m_ends[i]);
    }

    void send(End& end)
    {
        std::array<unsigned char, LENGTH> packet{0x80, 8};
        packet[2] = static_cast<unsigned char>(end.sequence >> 8);
        packet[3] = static_cast<unsigned char>(end.sequence++);
        unsigned int const timestamp = htonl(end.timestamp += 160);
        unsigned int const source = htonl(end.source);
        std::memcpy(&packet[4], &timestamp, 4);
        std::memcpy(&packet[8], &source, 4);
        long long const now = NOW();
        std::memcpy(&packet[12], &now, sizeof now);
        m_sent += ::send(end.descriptor, packet.data(), packet.size(), 0) == static_cast<ssize_t>(LENGTH);
    }

    void receive(int epoll)
    {
        std::array<epoll_event, 256> events;
        std::array<unsigned char, 2048> packet;
        int const count = epoll_wait(epoll, events.data(), static_cast<int>(events.size()), 1);
        for (int i = 0; i < count; ++i)
        {
            int const descriptor = events[static_cast<std::size_t>(i)].data.fd;
            while (recv(descriptor, packet.data(), packet.size(), 0) == static_cast<ssize_t>(LENGTH))
            {
                long long sent = 0;
                std::memcpy(&sent, &packet[12], sizeof sent);
                m_delays.push_back(NOW() - sent);
            }
        }
    }

    std::vector<End> m_ends;
    std::vector<long long> m_delays;
    std::size_t m_sent = 0;
};
} // namespace

int main(int count, char** arguments)
{
    Load load;
    unsigned int own = 0;
    unsigned int relay = 0;
    for (unsigned int source = 1; std::scanf("%u %u", &own, &relay) == 2; ++source)
        load.add(OPEN(own, relay, source * 7919));
    load.run(count > 1 ? std::atof(arguments[1]) : 5);
    load.print();
}
