// Call control on a thread of its own, which the program's other threads ask and tell.
#include "callcontrol.h"

#include <cstdio>
#include <latch>
#include <thread>
#include <tuple>

struct Program
{
    explicit Program(TYEventLoop& loop)
        : m_loop(loop)
        , m_timer(loop, EventPrio::NORMAL, ON_TIMER, this)
        , m_posted(new TYEvent(loop, EventPrio::HIGH, ON_POST, this))
    {
    }
    ~Program() { m_posted->destroy(); }

    static void ON_TIMER(void* program)
    {
        auto& self = *static_cast<Program*>(program);
        if (++self.m_ticks == 3)
            self.m_timer.stop();
        self.stopIfOver();
    }
    static void ON_POST(void* program)
    {
        auto& self = *static_cast<Program*>(program);
        ++self.m_posts;
        self.m_isRunning.count_down();
    }
    void stopIfOver()
    {
        if (m_ticks == 3 && m_isAsked)
            m_loop.stop();
    }

    TYEventLoop& m_loop;
    TYTimer m_timer;
    TYEvent* m_posted;
    std::latch m_isRunning{1};
    unsigned int m_ticks = 0;
    unsigned int m_posts = 0;
    bool m_isAsked = false;
};

int main()
{
    TYEventLoop loop;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    if (!CallControl::CREATE_CONTEXT("SWITCH").isOk())
        return 1;
    Program program(loop);
    if (!program.m_timer.startPeriodic(1).isOk())
        return 1;

    std::thread callControl([&] { loop.run(); });      // from here on everything above belongs to that thread
    std::ignore = program.m_posted->setIfNotPending(); // does not wait
    program.m_isRunning.wait(); // until its first turn the loop takes this thread, which made it, for its own

    unsigned int calls = 1;
    std::ignore = CallControl::GET_CC_SYNC_EVENT(EventPrio::NORMAL)
                      .execute( // waits until the loop has run it
                          [&]
                          {
                              calls = CallControl::GET_NUMBER_OF_CALLS();
                              program.m_isAsked = true;
                              program.stopIfOver();
                          });
    callControl.join(); // and from here on everything belongs to this thread again
    CallControl::DESTROY_CONTEXT("SWITCH");
    CallControl::SET_CC_EVENT_LOOP(nullptr);
    std::printf("own thread: %u ticks, %u post, %u calls\n", program.m_ticks, program.m_posts, calls);
}
