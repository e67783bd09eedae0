#include "platform/eventloop/TYEvent.h"

#include "platform/eventloop/TYEventLoop.h"

#include <atomic>
#include <functional>
#include <gtest/gtest.h>
#include <thread>
#include <tuple>
#include <utility>

namespace
{
/// An event whose work is a function; destroyed at the end unless the test did.
class Event
{
public:
    Event(TYEventLoop& loop, std::function<void()> work, EventPrio::Type priority = EventPrio::HIGH)
        : m_work(std::move(work)), m_event(new TYEvent(loop, priority, RUN, this))
    {
    }
    ~Event() { destroy(); }
    Event(Event const&) = delete;
    Event& operator=(Event const&) = delete;

    void post() { EXPECT_TRUE(m_event->setIfNotPending().isOk()); }
    bool isPending() const { return m_event->isPending(); }
    void destroy()
    {
        if (TYEvent* const event = std::exchange(m_event, nullptr))
            event->destroy();
    }

private:
    static void RUN(void* argument) { static_cast<Event*>(argument)->m_work(); }
    std::function<void()> m_work;
    TYEvent* m_event;
};

class TYEventTest : public testing::Test
{
protected:
    void TearDown() override { EXPECT_EQ(m_alive, TYEvent::s_numberOfInstances.load()); }

    unsigned int m_alive = TYEvent::s_numberOfInstances.load();
    TYEventLoop m_loop;
    unsigned int m_runs = 0;
};
} // namespace

TEST_F(TYEventTest, AnEventRunsOnceHoweverOftenItWasPosted)
{
    Event event(m_loop, [this] { ++m_runs; });
    EXPECT_FALSE(event.isPending());
    event.post();
    event.post();
    event.post();
    EXPECT_TRUE(event.isPending());
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_EQ(1U, m_runs);
    EXPECT_FALSE(event.isPending());
    EXPECT_FALSE(m_loop.runTurn());
}

TEST_F(TYEventTest, AnEventCanBePostedAgainAfterItRan)
{
    Event event(m_loop, [this] { ++m_runs; });
    for (unsigned int i = 1; i <= 3; ++i)
    {
        event.post();
        EXPECT_TRUE(m_loop.runTurn());
        EXPECT_EQ(i, m_runs);
    }
}

TEST_F(TYEventTest, AnEventIsNoLongerPendingInItsOwnHandler)
{
    bool wasPending = true;
    Event* self = nullptr;
    Event event(m_loop, [&] { wasPending = self->isPending(); });
    self = &event;
    event.post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_FALSE(wasPending);
}

TEST_F(TYEventTest, AnEventTakenIntoTheTurnStaysPendingUntilItRuns)
{
    bool wasPending = false;
    Event* second = nullptr;
    Event first(m_loop,
                [&]
                {
                    wasPending = second->isPending();
                    second->post(); // coalesces with the run that this turn still owes
                });
    Event secondEvent(m_loop, [this] { ++m_runs; });
    second = &secondEvent;
    first.post();
    second->post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_TRUE(wasPending);
    EXPECT_EQ(1U, m_runs);
    EXPECT_FALSE(m_loop.runTurn());
}

TEST_F(TYEventTest, PostedFromItsOwnHandlerItRunsInTheNextTurn)
{
    Event* self = nullptr;
    Event event(m_loop,
                [&]
                {
                    if (++m_runs < 3)
                        self->post();
                });
    self = &event;
    event.post();
    for (unsigned int i = 1; i <= 3; ++i)
    {
        EXPECT_TRUE(m_loop.runTurn());
        EXPECT_EQ(i, m_runs);
    }
    EXPECT_FALSE(m_loop.runTurn());
}

TEST_F(TYEventTest, DestroyTakesBackAPendingPost)
{
    Event event(m_loop, [this] { ++m_runs; });
    event.post();
    event.destroy();
    EXPECT_FALSE(m_loop.runTurn());
    EXPECT_EQ(0U, m_runs);
}

TEST_F(TYEventTest, DestroyTakesBackAPostThatTheRunningTurnHasTaken)
{
    Event* second = nullptr;
    Event* third = nullptr;
    Event first(m_loop, [&] { second->destroy(); });
    Event secondEvent(m_loop, [this] { m_runs += 10; });
    Event thirdEvent(m_loop, [this] { ++m_runs; });
    second = &secondEvent;
    third = &thirdEvent;
    first.post();
    second->post();
    third->post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_EQ(1U, m_runs); // the third alone
    EXPECT_FALSE(m_loop.runTurn());
}

TEST_F(TYEventTest, DestroyTakesBackAPostMadeDuringTheTurn)
{
    Event* second = nullptr;
    Event first(m_loop,
                [&]
                {
                    second->post();
                    second->destroy();
                });
    Event secondEvent(m_loop, [this] { ++m_runs; });
    second = &secondEvent;
    first.post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_FALSE(m_loop.runTurn());
    EXPECT_EQ(0U, m_runs);
}

TEST_F(TYEventTest, AnEventMayBeDestroyedInItsOwnHandler)
{
    Event* self = nullptr;
    unsigned int alive = 0;
    Event event(m_loop,
                [&]
                {
                    self->destroy();
                    alive = TYEvent::s_numberOfInstances;
                    ++m_runs;
                });
    self = &event;
    event.post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_EQ(1U, m_runs);
    EXPECT_EQ(m_alive + 1, alive); // the loop held it meanwhile
    EXPECT_EQ(m_alive, TYEvent::s_numberOfInstances);
}

TEST_F(TYEventTest, APostMadeBeforeDestroyInTheOwnHandlerIsTakenBack)
{
    Event* self = nullptr;
    Event event(m_loop,
                [&]
                {
                    ++m_runs;
                    self->post();
                    self->destroy();
                });
    self = &event;
    event.post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_FALSE(m_loop.runTurn());
    EXPECT_EQ(1U, m_runs);
}

TEST_F(TYEventTest, APostAfterDestroyIsRefused)
{
    TYEvent* const event = new TYEvent(
        m_loop, EventPrio::HIGH, [](void* runs) { ++*static_cast<unsigned int*>(runs); }, &m_runs);
    event->addReference();
    event->destroy();
    EXPECT_EQ(XCode::REFUSED, event->setIfNotPending());
    EXPECT_FALSE(event->isPending());
    EXPECT_FALSE(m_loop.runTurn());
    EXPECT_EQ(0U, m_runs);
    EXPECT_EQ(m_alive + 1, TYEvent::s_numberOfInstances);
    event->removeReference();
}

TEST_F(TYEventTest, ADestroyedEventIsRefusedToTwoThreadsThatMeetInPostingIt)
{
    TYEvent* const event = new TYEvent(
        m_loop, EventPrio::HIGH, [](void*) {}, nullptr);
    event->addReference();
    event->destroy();
    std::atomic<unsigned int> accepted{0};
    auto const post = [&]
    {
        for (int i = 0; i < 20000; ++i)
            accepted += event->setIfNotPending().isOk() ? 1 : 0;
    };
    std::thread other(post);
    post();
    other.join();
    EXPECT_EQ(0U, accepted.load());
    EXPECT_FALSE(m_loop.runTurn());
    event->removeReference();
}

TEST_F(TYEventTest, TheLastReferenceTakesTheEventAlong)
{
    TYEvent* const event = new TYEvent(
        m_loop, EventPrio::LOW, [](void*) {}, nullptr);
    EXPECT_EQ(m_alive + 1, TYEvent::s_numberOfInstances);
    event->addReference();
    event->removeReference();
    EXPECT_EQ(m_alive + 1, TYEvent::s_numberOfInstances);
    event->destroy();
    EXPECT_EQ(m_alive, TYEvent::s_numberOfInstances);
}

TEST_F(TYEventTest, ADerivedEventRunsItsOwnHandler)
{
    class Derived : public TYEvent
    {
    public:
        Derived(TYEventLoop& loop, unsigned int& runs)
            : TYEvent(loop, EventPrio::NORMAL, nullptr, nullptr), m_runsOfTest(runs)
        {
        }

    protected:
        void handle() override { ++m_runsOfTest; }

    private:
        unsigned int& m_runsOfTest;
    };
    TYEvent* const event = new Derived(m_loop, m_runs);
    EXPECT_TRUE(event->setIfNotPending().isOk());
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_EQ(1U, m_runs);
    event->destroy();
}

#ifndef NDEBUG
TEST_F(TYEventTest, APriorityThatTheLoopDoesNotHaveStopsADebugBuild)
{
    EXPECT_DEATH(std::ignore = new TYEvent(
                     m_loop, static_cast<EventPrio::Type>(EventPrio::COUNT), [](void*) {}, nullptr),
                 "an event of a priority that the loop does not have");
}
#else
TEST_F(TYEventTest, APriorityThatTheLoopDoesNotHaveCountsAsTheLowest)
{
    Event event(
        m_loop, [this] { ++m_runs; }, static_cast<EventPrio::Type>(EventPrio::COUNT));
    event.post();
    EXPECT_TRUE(m_loop.runTurn());
    EXPECT_EQ(1U, m_runs);
}
#endif
