#include "platform/eventloop/TYEventLoop.h"

#include "platform/eventloop/TYTimer.h"
#include "testing/DrivenClock.h"

#include <atomic>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <optional>
#include <poll.h>
#include <stdexcept>
#include <string>
#include <thread>
#include <tuple>
#include <utility>
#include <vector>

namespace
{
/// An event whose work is a function.
class Event
{
public:
    Event(TYEventLoop& loop, EventPrio::Type priority, std::function<void()> work)
        : m_work(std::move(work)), m_event(new TYEvent(loop, priority, RUN, this))
    {
    }
    ~Event() { m_event->destroy(); }
    Event(Event const&) = delete;
    Event& operator=(Event const&) = delete;

    void post() { EXPECT_TRUE(m_event->setIfNotPending().isOk()); }

private:
    static void RUN(void* argument) { static_cast<Event*>(argument)->m_work(); }
    std::function<void()> m_work;
    TYEvent* m_event;
};

bool IS_READABLE(int fd)
{
    pollfd polled{fd, POLLIN, 0};
    return poll(&polled, 1, 0) == 1;
}

class TYEventLoopTest : public testing::Test
{
protected:
    void TearDown() override
    {
        m_events.clear();
        EXPECT_EQ(m_alive, TYEvent::s_numberOfInstances.load());
    }

    /// An event that notes its letter.
    Event& event(EventPrio::Type priority, char letter)
    {
        return event(priority, [this, letter] { m_order += letter; });
    }
    Event& event(EventPrio::Type priority, std::function<void()> work)
    {
        return *m_events.emplace_back(std::make_unique<Event>(*m_loop, priority, std::move(work)));
    }

    unsigned int m_alive = TYEvent::s_numberOfInstances.load();
    std::optional<TYEventLoop> m_loop{std::in_place};
    std::vector<std::unique_ptr<Event>> m_events;
    std::string m_order;
};
} // namespace

TEST_F(TYEventLoopTest, ATurnWithoutWorkSaysSo) { EXPECT_FALSE(m_loop->runTurn()); }

TEST_F(TYEventLoopTest, LowerPriorityValuesRunFirst)
{
    Event& low = event(EventPrio::LOW, 'l');
    Event& normal = event(EventPrio::NORMAL, 'n');
    Event& high = event(EventPrio::HIGH, 'h');
    Event& highest = event(EventPrio::HIGHEST, 'H');
    for (Event* const posted : {&low, &highest, &normal, &high})
        posted->post();
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ("Hhnl", m_order);
}

TEST_F(TYEventLoopTest, WithinAPriorityThePostingOrderHolds)
{
    Event& a = event(EventPrio::HIGH, 'a');
    Event& b = event(EventPrio::HIGH, 'b');
    Event& c = event(EventPrio::HIGH, 'c');
    for (Event* const posted : {&b, &c, &a, &b}) // the second post of b keeps its first place
        posted->post();
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ("bca", m_order);
}

TEST_F(TYEventLoopTest, WhatIsPostedDuringATurnRunsInTheNextEvenAtAHigherPriority)
{
    Event& urgent = event(EventPrio::HIGHEST, 'u');
    Event& later = event(EventPrio::LOW, 'l');
    Event& first = event(EventPrio::HIGH,
                         [&]
                         {
                             m_order += 'f';
                             urgent.post();
                         });
    first.post();
    later.post();
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ("fl", m_order);
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ("flu", m_order);
    EXPECT_FALSE(m_loop->runTurn());
}

TEST_F(TYEventLoopTest, ThePollDescriptorIsReadableExactlyWhileWorkIsPending)
{
    int const fd = m_loop->getPollFd();
    ASSERT_GE(fd, 0);
    EXPECT_EQ(fd, m_loop->getPollFd());
    EXPECT_FALSE(IS_READABLE(fd));

    Event& a = event(EventPrio::HIGH, 'a');
    Event& b = event(EventPrio::LOW, 'b');
    a.post();
    b.post();
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_TRUE(IS_READABLE(fd)); // looking does not change it
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));

    b.post();
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYEventLoopTest, ThePollDescriptorTellsOfWorkPostedDuringTheTurn)
{
    int const fd = m_loop->getPollFd();
    Event& second = event(EventPrio::HIGH, 's');
    Event& first = event(EventPrio::HIGH, [&] { second.post(); });
    first.post();
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYEventLoopTest, ThePollDescriptorForgetsWorkThatIsTakenBack)
{
    int const fd = m_loop->getPollFd();
    auto first = std::make_unique<Event>(*m_loop, EventPrio::HIGH, [] {});
    auto second = std::make_unique<Event>(*m_loop, EventPrio::LOW, [] {});
    first->post();
    second->post();
    first.reset();
    EXPECT_TRUE(IS_READABLE(fd));
    second.reset();
    EXPECT_FALSE(IS_READABLE(fd));

    Event& third = event(EventPrio::HIGH, 't'); // and tells of the next
    third.post();
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYEventLoopTest, APollDescriptorAskedForLateTellsOfEarlierWork)
{
    Event& early = event(EventPrio::HIGH, 'e');
    early.post();
    int const fd = m_loop->getPollFd();
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYEventLoopTest, ThePollDescriptorIsClosedWithTheLoop)
{
    int const fd = m_loop->getPollFd();
    m_loop.reset();
    pollfd polled{fd, POLLIN, 0};
    EXPECT_EQ(1, poll(&polled, 1, 0));
    EXPECT_NE(0, polled.revents & POLLNVAL);
}

TEST_F(TYEventLoopTest, AHostLoopSeesWorkOfAnotherThread)
{
    int const fd = m_loop->getPollFd();
    Event& posted = event(EventPrio::HIGH, 'p');
    std::thread poster([&] { posted.post(); });
    pollfd polled{fd, POLLIN, 0};
    EXPECT_EQ(1, poll(&polled, 1, -1)); // until the thread has posted
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ("p", m_order);
    poster.join();
}

TEST_F(TYEventLoopTest, ABusyHostRunsWhatItPostedWithoutTheDescriptor)
{
    int const fd = m_loop->getPollFd();
    Event& later = event(EventPrio::NORMAL, 'b');
    Event& first = event(EventPrio::NORMAL,
                         [&]
                         {
                             m_order += 'a';
                             later.post();
                         });
    TYTimer timer(
        *m_loop, EventPrio::NORMAL, [](void* order) { *static_cast<std::string*>(order) += 't'; }, &m_order);
    m_loop->beginBusy();
    first.post();
    timer.start(0);
    EXPECT_FALSE(IS_READABLE(fd)) << "the host is not waiting";
    m_loop->endBusy();
    EXPECT_EQ(m_order, "tab");
    EXPECT_FALSE(IS_READABLE(fd));
    first.post();
    EXPECT_TRUE(IS_READABLE(fd)) << "it is no longer busy";
}

TEST_F(TYEventLoopTest, ABusyHostIsNotKeptByOneThatPostsItselfForEver)
{
    int const fd = m_loop->getPollFd();
    unsigned int runs = 0;
    Event* self = nullptr;
    self = &event(EventPrio::NORMAL,
                  [&]
                  {
                      if (++runs < 1000)
                          self->post();
                  });
    m_loop->beginBusy();
    self->post();
    m_loop->endBusy();
    EXPECT_LT(runs, 100u);
    EXPECT_TRUE(IS_READABLE(fd)) << "the rest is told";
    while (m_loop->runTurn())
    {
    }
    EXPECT_EQ(runs, 1000u);
}

TEST_F(TYEventLoopTest, ABusyHostHearsOfAnotherThread)
{
    int const fd = m_loop->getPollFd();
    m_loop->beginBusy();
    std::thread([&] { event(EventPrio::NORMAL, 'a').post(); }).join();
    EXPECT_TRUE(IS_READABLE(fd));
    m_loop->endBusy();
    EXPECT_EQ(m_order, "a");
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYEventLoopTest, ABusyHostIsOverWithAnException)
{
    int const fd = m_loop->getPollFd();
    Event& failing = event(EventPrio::NORMAL, [] { throw std::runtime_error("a handler"); });
    m_loop->beginBusy();
    failing.post();
    EXPECT_THROW(m_loop->endBusy(), std::runtime_error);
    EXPECT_FALSE(IS_READABLE(fd));
    event(EventPrio::NORMAL, 'a').post();
    EXPECT_TRUE(IS_READABLE(fd));
}

TEST_F(TYEventLoopTest, AnExceptionOfAHandlerLeavesTheTurnAndTheRestRunsInTheNext)
{
    Event& thrower = event(EventPrio::HIGH, [] { throw std::runtime_error("a module's"); });
    Event& first = event(EventPrio::HIGH, 'f');
    Event& rest = event(EventPrio::LOW, 'r');
    Event& posted = event(EventPrio::LOW, 'p');
    int const fd = m_loop->getPollFd();
    for (Event* const each : {&rest, &thrower, &first})
        each->post();
    EXPECT_THROW(m_loop->runTurn(), std::runtime_error);
    EXPECT_FALSE(m_loop->isInTurn());
    EXPECT_EQ(m_order, "");
    EXPECT_TRUE(IS_READABLE(fd)) << "the host is to come back";
    EXPECT_EQ(m_loop->getTimeout(), 0);
    posted.post();
    rest.post();
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ(m_order, "frp");
    EXPECT_FALSE(m_loop->runTurn());
    thrower.post();
    EXPECT_THROW(m_loop->runTurn(), std::runtime_error) << "it can be posted again";
    EXPECT_FALSE(IS_READABLE(fd)) << "nothing is left";
}

TEST_F(TYEventLoopTest, AnExceptionBesideATimerLeavesTheTimerToTheNextTurn)
{
    DrivenClock const clock;
    Event& thrower = event(EventPrio::HIGH, [] { throw std::runtime_error("a module's"); });
    TYTimer timer(
        *m_loop, EventPrio::LOW, [](void* order) { *static_cast<std::string*>(order) += 't'; }, &m_order);
    timer.start(0);
    thrower.post();
    EXPECT_THROW(m_loop->runTurn(), std::runtime_error);
    EXPECT_FALSE(m_loop->isInTurn());
    EXPECT_TRUE(timer.isRunning());
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ(m_order, "t");
}

TEST_F(TYEventLoopTest, StopBeforeRunEndsItAtOnceAndOnlyOnce)
{
    Event& pending = event(EventPrio::HIGH,
                           [this]
                           {
                               m_order += 'p';
                               m_loop->stop();
                           });
    pending.post();
    m_loop->stop();
    m_loop->run();
    EXPECT_EQ("", m_order);
    m_loop->run(); // a second run is not concerned
    EXPECT_EQ("p", m_order);
}

TEST_F(TYEventLoopTest, StopFromAHandlerLetsTheTurnFinish)
{
    Event& next = event(EventPrio::HIGHEST, 'n');
    Event& stopping = event(EventPrio::HIGH,
                            [&]
                            {
                                m_loop->stop();
                                next.post();
                            });
    Event& last = event(EventPrio::LOW, 'l');
    stopping.post();
    last.post();
    m_loop->run();
    EXPECT_EQ("l", m_order);
    EXPECT_TRUE(m_loop->runTurn()); // the next turn has waited
    EXPECT_EQ("ln", m_order);
}

TEST_F(TYEventLoopTest, AnotherThreadStopsASleepingLoop)
{
    std::atomic<bool> hasRun{false};
    Event& started = event(EventPrio::HIGH,
                           [&]
                           {
                               hasRun = true;
                               hasRun.notify_one();
                           });
    started.post();
    std::thread stopper(
        [&]
        {
            hasRun.wait(false);
            m_loop->stop();
        });
    m_loop->run();
    stopper.join();
    EXPECT_TRUE(hasRun);
}

TEST_F(TYEventLoopTest, TheThreadThatRunsTheLoopIsItsThread)
{
    EXPECT_TRUE(m_loop->isLoopThread()); // it created the loop
    bool wasLoopThread = true;
    bool isLoopThread = false;
    std::thread(
        [&]
        {
            wasLoopThread = m_loop->isLoopThread();
            m_loop->stop();
            m_loop->run();
            isLoopThread = m_loop->isLoopThread();
        })
        .join();
    EXPECT_FALSE(wasLoopThread);
    EXPECT_TRUE(isLoopThread);
    EXPECT_FALSE(m_loop->isLoopThread());
    EXPECT_FALSE(m_loop->runTurn());
    EXPECT_TRUE(m_loop->isLoopThread());
}

TEST_F(TYEventLoopTest, NoPostOfSeveralThreadsIsLostWhileTheLoopRuns)
{
    constexpr unsigned int THREADS = 4;
    constexpr unsigned int POSTS = 2000;
    std::atomic<unsigned int> requested[THREADS + 1]{};
    unsigned int handled[THREADS + 1]{}; // by the loop's thread; the last of each is of an event that all post
    unsigned int runs = 0;
    std::vector<Event*> events;
    for (unsigned int i = 0; i <= THREADS; ++i)
        events.push_back(&event(static_cast<EventPrio::Type>(i % EventPrio::COUNT),
                                [&, i]
                                {
                                    handled[i] = requested[i];
                                    ++runs;
                                }));
    std::vector<std::thread> threads;
    for (unsigned int i = 0; i < THREADS; ++i)
        threads.emplace_back(
            [&, i]
            {
                for (unsigned int j = 0; j < POSTS; ++j)
                    for (unsigned int const posted : {i, THREADS})
                    {
                        ++requested[posted];
                        events[posted]->post();
                    }
            });
    std::thread stopper(
        [&]
        {
            for (std::thread& thread : threads)
                thread.join();
            m_loop->stop();
        });
    m_loop->run();
    stopper.join();
    std::ignore = m_loop->runTurn(); // what was posted between the last turn and the stop
    for (unsigned int i = 0; i <= THREADS; ++i)
        EXPECT_EQ(i < THREADS ? POSTS : THREADS * POSTS, handled[i]) << i;
    EXPECT_LE(runs, 2 * THREADS * POSTS + 1);
    EXPECT_FALSE(m_loop->runTurn());
}

TEST_F(TYEventLoopTest, PendingEventsDoNotRunWhenTheLoopEnds)
{
    unsigned int runs = 0;
    auto* const pending = new TYEvent(
        *m_loop, EventPrio::HIGH, [](void* argument) { ++*static_cast<unsigned int*>(argument); }, &runs);
    EXPECT_TRUE(pending->setIfNotPending().isOk());
    m_loop.reset();
    EXPECT_EQ(0U, runs);
    pending->removeReference();
}

#ifndef NDEBUG
TEST_F(TYEventLoopTest, ATurnInsideATurnStopsADebugBuild)
{
    Event& nesting = event(EventPrio::HIGH, [this] { std::ignore = m_loop->runTurn(); });
    nesting.post();
    EXPECT_DEATH(std::ignore = m_loop->runTurn(), "a turn inside a turn");
}
#endif
