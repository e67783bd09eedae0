#include "isdn/line/IsdnSocketLine.h"

#include "isdn/line/IsdnBlock.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/socket.h>

bool IsdnSocketLine::open()
{
    if (isOpen() || m_path.empty())
        return isOpen();
    close();
    if (std::optional<IsdnWires> wires = IsdnWires::CONNECT(m_path))
        m_wires = std::move(*wires);
    return isOpen();
}

void IsdnSocketLine::close()
{
    m_wires = IsdnWires();
    m_isGone = false;
}

std::size_t IsdnSocketLine::receive(std::span<unsigned char> frame)
{
    ssize_t const length = recv(m_wires.d.get(), frame.data(), frame.size(), MSG_DONTWAIT);
    if (length > 0)
        return static_cast<std::size_t>(length);
    m_isGone = length == 0 || (errno != EAGAIN && errno != EINTR);
    return 0;
}

bool IsdnSocketLine::send(std::span<unsigned char const> frame)
{
    return isOpen() && ::send(m_wires.d.get(), frame.data(), frame.size(), MSG_DONTWAIT | MSG_NOSIGNAL) ==
                           static_cast<ssize_t>(frame.size());
}

IsdnDescriptor IsdnSocketLine::openChannel(unsigned int timeslot)
{
    if (!isOpen() || !IS_B_CHANNEL(timeslot))
        return {};
    IsdnDescriptor channel(fcntl(m_wires.b[timeslot].get(), F_DUPFD_CLOEXEC, 0));
    IsdnBlock old;
    while (old.receive(channel.get()))
    {
    }
    return channel;
}
