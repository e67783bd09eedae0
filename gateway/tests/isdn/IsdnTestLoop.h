#pragma once

#include "host/SignallingLoop.h"
#include "platform/eventloop/TYEventLoop.h"
#include "testing/FailingAllocator.h"

#include <chrono>
#include <map>
#include <poll.h>
#include <vector>

/// An event loop and whatever descriptors are waited for, on the test's thread.
class IsdnTestLoop : public SignallingLoop
{
public:
    explicit IsdnTestLoop(TYEventLoop& loop) : m_loop(loop) { loop.getPollFd(); }

    void watch(int descriptor, std::function<void()> onReadable) override
    {
        m_handlers[descriptor] = std::move(onReadable);
    }
    void forget(int descriptor) override { m_handlers.erase(descriptor); }

    void run() override {} // turned by hand
    void stop() override {}

    /// Until it is done, or will not be: whether it is.
    template <class IsDone>
    bool runUntil(IsDone const& isDone, std::chrono::milliseconds patience = std::chrono::seconds(10))
    {
        auto const end = std::chrono::steady_clock::now() + patience;
        bool isDoneNow = isDone();
        while (!isDoneNow && std::chrono::steady_clock::now() < end)
        {
            turn(5);
            isDoneNow = isDone();
        }
        return isDoneNow;
    }
    /// Whether there was anything to do within so many milliseconds.
    bool turn(int milliseconds)
    {
        bool const hasWork = takeReadable(milliseconds);
        return m_loop.runTurn() || hasWork;
    }
    /// Until nothing has happened for a while.
    void settle()
    {
        while (turn(2))
        {
        }
    }

private:
    /// What the test itself needs of memory does not fail.
    bool takeReadable(int milliseconds)
    {
        std::vector<std::function<void()>> ready;
        bool hasWork = false;
        {
            FailingAllocator::Pause const unseen;
            std::vector<pollfd> waiting{{m_loop.getPollFd(), POLLIN, 0}};
            for (auto const& [descriptor, handler] : m_handlers)
                waiting.push_back({descriptor, POLLIN, 0});
            hasWork = poll(waiting.data(), waiting.size(), milliseconds) > 0;
            for (std::size_t i = 1; i < waiting.size(); ++i)
                if (waiting[i].revents != 0)
                    ready.push_back(m_handlers[waiting[i].fd]);
        }
        for (std::function<void()> const& handler : ready)
            handler();
        return hasWork;
    }

    TYEventLoop& m_loop;
    std::map<int, std::function<void()>> m_handlers;
};
