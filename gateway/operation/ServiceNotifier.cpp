#include "operation/ServiceNotifier.h"

#include <charconv>
#include <cstddef>
#include <cstdlib>
#include <string_view>
#include <sys/socket.h>
#include <sys/un.h>
#include <tuple>
#include <unistd.h>

namespace
{
std::string_view ENVIRONMENT(char const* name)
{
    char const* const value = std::getenv(name);
    return value != nullptr ? value : std::string_view();
}

/// Of the time after which the manager takes us for dead, a third.
unsigned int INTERVAL()
{
    std::string_view const text = ENVIRONMENT("WATCHDOG_USEC");
    unsigned long long microseconds = 0;
    std::from_chars(text.data(), text.data() + text.size(), microseconds);
    return static_cast<unsigned int>(microseconds / 3000);
}
} // namespace

ServiceNotifier::ServiceNotifier(TYEventLoop& loop)
    : m_socket(ENVIRONMENT("NOTIFY_SOCKET"))
    , m_interval(m_socket.empty() ? 0 : INTERVAL())
    , m_timer(loop, EventPrio::LOW, ON_TIMER, this)
{
}

void ServiceNotifier::tellReady()
{
    send("READY=1");
    if (m_interval != 0)
        std::ignore = m_timer.startPeriodic(m_interval);
}

void ServiceNotifier::ON_TIMER(void* notifier) { static_cast<ServiceNotifier*>(notifier)->send("WATCHDOG=1"); }

/// A name that begins with "@" is one outside of the file system.
void ServiceNotifier::send(std::string const& text) const
{
    sockaddr_un address = {};
    if (m_socket.empty() || m_socket.size() >= sizeof address.sun_path)
        return;
    address.sun_family = AF_UNIX;
    m_socket.copy(address.sun_path, m_socket.size());
    if (address.sun_path[0] == '@')
        address.sun_path[0] = '\0';
    int const descriptor = socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    sendto(descriptor, text.data(), text.size(), MSG_NOSIGNAL, reinterpret_cast<sockaddr*>(&address),
           static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + m_socket.size()));
    close(descriptor);
}
