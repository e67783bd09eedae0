#include "media/rtp/RtpPorts.h"

#include "media/rtp/DatagramAddress.h"

#include <algorithm>
#include <cerrno>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>

Descriptor& Descriptor::operator=(Descriptor&& other) noexcept
{
    reset();
    m_descriptor = other.release();
    return *this;
}

int Descriptor::release() { return std::exchange(m_descriptor, -1); }

void Descriptor::reset()
{
    if (m_descriptor >= 0)
        close(release());
}

namespace
{
void SET(int descriptor, int level, int option, int value)
{
    setsockopt(descriptor, level, option, &value, sizeof value); // what the system does not know it does without
}

/// No socket and errno when that is not possible.
Descriptor OPEN(IpAddress const& local, unsigned short port, unsigned int differentiation)
{
    DatagramAddress const address(MediaAddress{local, port});
    Descriptor made(socket(address.any.sa_family, SOCK_DGRAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
    if (made.get() < 0)
        return {};
    int const trafficClass = static_cast<int>(differentiation << 2);
    if (local.getVersion() == 6)
    {
        SET(made.get(), IPPROTO_IPV6, IPV6_V6ONLY, 1);
        SET(made.get(), IPPROTO_IPV6, IPV6_TCLASS, trafficClass);
    }
    else
        SET(made.get(), IPPROTO_IP, IP_TOS, trafficClass);
    if (bind(made.get(), &address.any, address.length) == 0)
        return made;
    int const error = errno;
    made.reset();
    errno = error;
    return {};
}
} // namespace

RtpPortRange::RtpPortRange(unsigned short first, unsigned short last, unsigned int differentiation)
    : m_first(std::max((first + 1u) & ~1u, 2u))
    , m_pairs(last > m_first ? (last - m_first + 1u) / 2 : 0)
    , m_differentiation(std::min(differentiation, 63u))
{
}

XCode RtpPortRange::open(IpAddress const& local, RtpPorts& ports)
{
    for (unsigned int tries = 0; tries < m_pairs; ++tries)
    {
        auto const port = static_cast<unsigned short>(m_first + 2 * m_next);
        m_next = (m_next + 1) % m_pairs;
        Descriptor rtp = OPEN(local, port, m_differentiation);
        Descriptor rtcp =
            rtp.get() < 0 ? Descriptor() : OPEN(local, static_cast<unsigned short>(port + 1), m_differentiation);
        if (rtcp.get() >= 0)
        {
            ports = {std::move(rtp), std::move(rtcp), {local, port}};
            return XCode::OK;
        }
        if (errno != EADDRINUSE && errno != EACCES)
            return XCode::FAILURE;
    }
    return XCode::ABSENT;
}
