// Call control on asio: waits for the loop's descriptor to be readable, runs a turn, waits again.
#include "callcontrol.h"

#include <asio/io_context.hpp>
#include <asio/posix/stream_descriptor.hpp>

#include <cstdio>
#include <thread>
#include <tuple>

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

class Turns
{
public:
    Turns(asio::io_context& host, TYEventLoop& loop, Program const& program)
        : m_descriptor(host, loop.getPollFd()), m_loop(loop), m_program(program)
    {
    }
    ~Turns() { m_descriptor.release(); } // it is the loop's, which closes it

    void wait()
    {
        m_descriptor.async_wait(asio::posix::stream_descriptor::wait_read,
                                [this](asio::error_code const& error)
                                {
                                    m_loop.runTurn();
                                    if (!error && !m_program.isOver())
                                        wait(); // else there is nothing left to wait for: the host's run() returns
                                });
    }

private:
    asio::posix::stream_descriptor m_descriptor;
    TYEventLoop& m_loop;
    Program const& m_program;
};

int main()
{
    TYEventLoop loop;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    if (!CallControl::CREATE_CONTEXT("SWITCH").isOk())
        return 1;
    Program program(loop);
    asio::io_context host(1); // one thread runs it: call control's
    Turns turns(host, loop, program);
    if (!program.m_timer.startPeriodic(1).isOk())
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
    turns.wait();
    host.run();
    other.join();
    CallControl::DESTROY_CONTEXT("SWITCH");
    CallControl::SET_CC_EVENT_LOOP(nullptr);
    std::printf("asio: %u ticks, %u post, %u calls\n", program.m_ticks, program.m_posts, calls);
}
