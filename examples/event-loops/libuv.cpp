// Call control on libuv: a poll handle runs a turn whenever the loop's descriptor is readable.
#include "callcontrol.h"

#include <cstdio>
#include <thread>
#include <tuple>
#include <uv.h>

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

struct Turns
{
    TYEventLoop& loop;
    Program& program;
    uv_poll_t poll;

    static void RUN(uv_poll_t* handle, int, int)
    {
        auto& self = *static_cast<Turns*>(handle->data);
        self.loop.runTurn();
        if (self.program.isOver())
            uv_close(reinterpret_cast<uv_handle_t*>(handle), nullptr); // the last handle: uv_run returns
    }
};

int main()
{
    TYEventLoop loop;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    if (!CallControl::CREATE_CONTEXT("SWITCH").isOk())
        return 1;
    Program program(loop);
    uv_loop_t host;
    Turns turns{loop, program, {}};
    turns.poll.data = &turns;
    if (uv_loop_init(&host) != 0 || uv_poll_init(&host, &turns.poll, loop.getPollFd()) != 0 ||
        uv_poll_start(&turns.poll, UV_READABLE, Turns::RUN) != 0 || !program.m_timer.startPeriodic(1).isOk())
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
    uv_run(&host, UV_RUN_DEFAULT);
    other.join();
    CallControl::DESTROY_CONTEXT("SWITCH");
    CallControl::SET_CC_EVENT_LOOP(nullptr);
    if (uv_loop_close(&host) != 0) // before the loop, whose descriptor it watched, ends
        return 1;
    std::printf("libuv: %u ticks, %u post, %u calls\n", program.m_ticks, program.m_posts, calls);
}
