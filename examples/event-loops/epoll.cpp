// Call control on a host's own epoll loop: the loop's descriptor beside the host's.
#include "callcontrol.h"

#include <cstdio>
#include <sys/epoll.h>
#include <thread>
#include <tuple>
#include <unistd.h>

struct Program
{
    explicit Program(TYEventLoop& loop)
        : m_timer(loop, EventPrio::NORMAL, ON_TIMER, this), m_posted(new TYEvent(loop, EventPrio::HIGH, ON_POST, this))
    {
    }
    ~Program() { m_posted->destroy(); }

    static void ON_TIMER(void* program)
    {
        auto& self = *static_cast<Program*>(program);
        if (++self.m_ticks == 3)
            self.m_timer.stop();
    }
    static void ON_POST(void* program) { ++static_cast<Program*>(program)->m_posts; }
    bool isOver() const { return m_ticks == 3 && m_posts == 1; }

    TYTimer m_timer;
    TYEvent* m_posted;
    unsigned int m_ticks = 0;
    unsigned int m_posts = 0;
};

int main()
{
    TYEventLoop loop;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    if (!CallControl::CREATE_CONTEXT("SWITCH").isOk())
        return 1;
    Program program(loop);
    int const host = epoll_create1(EPOLL_CLOEXEC);
    int const fd = loop.getPollFd(); // before other threads post
    epoll_event interest{};
    interest.events = EPOLLIN;
    interest.data.fd = fd;
    if (epoll_ctl(host, EPOLL_CTL_ADD, fd, &interest) != 0 || !program.m_timer.startPeriodic(1).isOk())
        return 1;

    unsigned int calls = 1;
    std::thread other(
        [&]
        {
            // waits until the loop has run it; then asks for something to be done without waiting
            std::ignore = CallControl::GET_CC_SYNC_EVENT(EventPrio::NORMAL)
                              .execute([&] { calls = CallControl::GET_NUMBER_OF_CALLS(); });
            std::ignore = program.m_posted->setIfNotPending();
        });
    while (!program.isOver())
    {
        epoll_event ready[8];
        int const count = epoll_wait(host, ready, 8, -1);
        for (int i = 0; i < count; ++i)
            if (ready[i].data.fd == fd)
                loop.runTurn(); // a turn may have left more to do: the descriptor is readable again then
    }
    other.join();
    CallControl::DESTROY_CONTEXT("SWITCH");
    CallControl::SET_CC_EVENT_LOOP(nullptr);
    close(host);
    std::printf("epoll: %u ticks, %u post, %u calls\n", program.m_ticks, program.m_posts, calls);
}
