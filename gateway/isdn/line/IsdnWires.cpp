#include "isdn/line/IsdnWires.h"

#include <cerrno>
#include <cstring>
#include <sys/socket.h>
#include <sys/un.h>
#include <utility>

namespace
{
constexpr int KIND = SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC;
constexpr std::size_t CHANNELS = IsdnLine::LAST_TIMESLOT - 1;
constexpr std::size_t RIGHTS = CHANNELS * sizeof(int);
constexpr char GREETING[] = "E1/1";

using Pair = std::pair<IsdnWires, IsdnWires>;

bool MAKE_PAIR(IsdnDescriptor& one, IsdnDescriptor& other)
{
    int ends[2];
    if (socketpair(AF_UNIX, KIND, 0, ends) != 0)
        return false;
    one.reset(ends[0]);
    other.reset(ends[1]);
    return true;
}

bool MAKE_CHANNELS(Pair& line)
{
    bool isMade = true;
    for (unsigned int timeslot = 1; timeslot <= IsdnLine::LAST_TIMESLOT; ++timeslot)
        if (IsdnLine::IS_B_CHANNEL(timeslot))
            isMade = isMade && MAKE_PAIR(line.first.b[timeslot], line.second.b[timeslot]);
    return isMade;
}

/// A message of one text and room for the descriptors that travel with it.
struct Greeting
{
    Greeting()
    {
        part.iov_base = text;
        part.iov_len = sizeof text;
        message.msg_iov = &part;
        message.msg_iovlen = 1;
        message.msg_control = rights;
        message.msg_controllen = sizeof rights;
    }

    alignas(cmsghdr) char rights[CMSG_SPACE(RIGHTS)] = {};
    char text[sizeof GREETING] = {};
    iovec part = {};
    msghdr message = {};
};

bool HAND_OVER(int connection, IsdnWires const& wires)
{
    Greeting greeting;
    std::memcpy(greeting.text, GREETING, sizeof GREETING);
    cmsghdr* const header = CMSG_FIRSTHDR(&greeting.message);
    header->cmsg_level = SOL_SOCKET;
    header->cmsg_type = SCM_RIGHTS;
    header->cmsg_len = CMSG_LEN(RIGHTS);
    unsigned char* out = CMSG_DATA(header);
    for (unsigned int timeslot = 1; timeslot <= IsdnLine::LAST_TIMESLOT; ++timeslot)
        if (IsdnLine::IS_B_CHANNEL(timeslot))
        {
            int const descriptor = wires.b[timeslot].get();
            std::memcpy(std::exchange(out, out + sizeof descriptor), &descriptor, sizeof descriptor);
        }
    return sendmsg(connection, &greeting.message, MSG_NOSIGNAL) == static_cast<ssize_t>(sizeof GREETING);
}

/// Owns whatever came, so that a wrong greeting leaves no descriptor behind. Whether it was all of them.
bool TAKE_CHANNELS(msghdr& message, IsdnWires& wires)
{
    unsigned int timeslot = 0;
    for (cmsghdr* header = CMSG_FIRSTHDR(&message); header != nullptr; header = CMSG_NXTHDR(&message, header))
    {
        if (header->cmsg_level != SOL_SOCKET || header->cmsg_type != SCM_RIGHTS)
            continue;
        unsigned char const* in = CMSG_DATA(header);
        for (std::size_t left = (header->cmsg_len - CMSG_LEN(0)) / sizeof(int); left > 0; --left)
        {
            int descriptor = -1;
            std::memcpy(&descriptor, std::exchange(in, in + sizeof descriptor), sizeof descriptor);
            timeslot += timeslot + 1 == IsdnLine::D_TIMESLOT ? 2 : 1;
            if (timeslot <= IsdnLine::LAST_TIMESLOT)
                wires.b[timeslot].reset(descriptor);
            else
                close(descriptor);
        }
    }
    return timeslot == IsdnLine::LAST_TIMESLOT;
}
} // namespace

std::optional<Pair> IsdnWires::MAKE()
{
    Pair line;
    if (!MAKE_PAIR(line.first.d, line.second.d) || !MAKE_CHANNELS(line))
        return std::nullopt;
    return line;
}

std::optional<IsdnWires> IsdnWires::CONNECT(std::string const& path)
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    Pair line;
    if (path.size() >= sizeof address.sun_path || !MAKE_CHANNELS(line))
        return std::nullopt;
    path.copy(address.sun_path, path.size());
    line.first.d.reset(socket(AF_UNIX, KIND, 0));
    if (connect(line.first.d.get(), reinterpret_cast<sockaddr const*>(&address), sizeof address) != 0 ||
        !HAND_OVER(line.first.d.get(), line.second))
        return std::nullopt;
    return std::move(line.first);
}

std::optional<IsdnWires> IsdnWires::TAKE(IsdnDescriptor& connection, bool& isEarly)
{
    Greeting greeting;
    IsdnWires wires;
    ssize_t const length = recvmsg(connection.get(), &greeting.message, MSG_DONTWAIT | MSG_CMSG_CLOEXEC);
    isEarly = length < 0 && (errno == EAGAIN || errno == EINTR);
    if (length < 0)
        return std::nullopt;
    bool const isWhole = TAKE_CHANNELS(greeting.message, wires);
    if (!isWhole || length != static_cast<ssize_t>(sizeof GREETING) ||
        std::memcmp(greeting.text, GREETING, sizeof GREETING) != 0)
        return std::nullopt;
    wires.d = std::move(connection);
    return wires;
}
