#include "host/EpollLoop.h"

#include <array>
#include <cerrno>
#include <stdexcept>
#include <sys/epoll.h>
#include <unistd.h>

EpollLoop::EpollLoop() : m_descriptor(epoll_create1(EPOLL_CLOEXEC))
{
    if (m_descriptor < 0)
        throw std::runtime_error("no descriptor for the event loop");
}

EpollLoop::~EpollLoop() { close(m_descriptor); }

void EpollLoop::watch(int descriptor, std::function<void()> onReadable)
{
    m_handlers[descriptor] = std::make_shared<std::function<void()>>(std::move(onReadable));
    epoll_event event = {};
    event.events = EPOLLIN;
    event.data.fd = descriptor;
    if (epoll_ctl(m_descriptor, EPOLL_CTL_ADD, descriptor, &event) == 0 || errno == EEXIST)
        return;
    m_handlers.erase(descriptor);
    throw std::runtime_error("the event loop takes no descriptor");
}

void EpollLoop::forget(int descriptor)
{
    if (m_handlers.erase(descriptor) != 0)
        epoll_ctl(m_descriptor, EPOLL_CTL_DEL, descriptor, nullptr);
}

void EpollLoop::run()
{
    m_isRunning = true;
    while (m_isRunning)
        runTurn();
}

/// Whoever runs may forget those that are still to run.
void EpollLoop::runTurn()
{
    std::array<epoll_event, 64> events{};
    int const count = epoll_wait(m_descriptor, events.data(), static_cast<int>(events.size()), -1);
    beginBusy();
    for (int i = 0; i < count; ++i)
        if (auto const found = m_handlers.find(events[static_cast<std::size_t>(i)].data.fd); found != m_handlers.end())
        {
            auto const handler = found->second;
            (*handler)();
        }
    endBusy();
}
