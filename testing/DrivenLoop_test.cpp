#include "testing/DrivenLoop.h"

#include "callcontrol/CallControl.h"
#include "platform/eventloop/TYEvent.h"
#include "platform/eventloop/TYTimer.h"
#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

namespace
{
/// Posts itself again so many times more.
struct Repeating
{
    explicit Repeating(TYEventLoop& loop) : event(new TYEvent(loop, EventPrio::HIGH, RUN, this)) {}
    ~Repeating() { event->destroy(); }
    Repeating(Repeating const&) = delete;
    Repeating& operator=(Repeating const&) = delete;

    static void RUN(void* argument)
    {
        auto& self = *static_cast<Repeating*>(argument);
        ++self.runs;
        if (self.more == 0)
            return;
        --self.more;
        EXPECT_TRUE(self.event->setIfNotPending().isOk());
    }

    TYEvent* event;
    unsigned int more = 0;
    unsigned int runs = 0;
};
} // namespace

TEST(DrivenLoop, IsCallControlsLoopWhileItLives)
{
    TYEventLoop* const before = CallControl::GET_CC_EVENT_LOOP();
    {
        DrivenLoop loop;
        EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), &loop);
        {
            DrivenLoop inner;
            EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), &inner);
        }
        EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), &loop);
    }
    EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), before);
}

TEST(DrivenLoop, LeavesALoopThatWasSetMeanwhile)
{
    TYEventLoop* const before = CallControl::GET_CC_EVENT_LOOP();
    TYEventLoop other;
    {
        DrivenLoop const loop;
        CallControl::SET_CC_EVENT_LOOP(&other);
    }
    EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), &other);
    CallControl::SET_CC_EVENT_LOOP(before);
}

TEST(DrivenLoop, ATurnSaysWhetherThereWasAnythingToDo)
{
    DrivenLoop loop;
    Repeating work(loop);
    EXPECT_FALSE(loop.turn());
    EXPECT_TRUE(work.event->setIfNotPending().isOk());
    EXPECT_TRUE(loop.turn());
    EXPECT_FALSE(loop.turn());
    EXPECT_EQ(work.runs, 1u);
}

TEST(DrivenLoop, SettlingCountsTheTurnsThatHadWork)
{
    DrivenLoop loop;
    Repeating work(loop);
    EXPECT_EQ(loop.settle(), 0u);
    work.more = 2;
    EXPECT_TRUE(work.event->setIfNotPending().isOk());
    EXPECT_EQ(loop.settle(), 3u);
    EXPECT_EQ(loop.settle(), 0u);
}

TEST(DrivenLoop, SettlingGivesUpAtItsBound)
{
    DrivenLoop loop;
    Repeating work(loop);
    work.more = 1000000;
    EXPECT_TRUE(work.event->setIfNotPending().isOk());
    EXPECT_EQ(loop.settle(5), 5u);
    EXPECT_EQ(loop.settle(), DrivenLoop::MANY_TURNS);
    EXPECT_EQ(work.runs, 5u + DrivenLoop::MANY_TURNS);
}

TEST(DrivenLoop, RunsTheTimersThatTheDrivenClockMakesDue)
{
    DrivenClock clock;
    DrivenLoop loop;
    unsigned int runs = 0;
    TYTimer timer(
        loop, EventPrio::HIGH, [](void* argument) { ++*static_cast<unsigned int*>(argument); }, &runs);
    EXPECT_TRUE(timer.startPeriodic(30000).isOk());
    EXPECT_EQ(loop.settle(), 0u);
    clock.advance(30000);
    EXPECT_EQ(loop.settle(), 1u); // a periodic timer does not keep the loop from settling
    EXPECT_EQ(runs, 1u);
}
