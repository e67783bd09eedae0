#include "platform/eventloop/TYSyncEvent.h"

#include "platform/eventloop/TYEventLoop.h"

#include <future>
#include <gtest/gtest.h>
#include <optional>
#include <poll.h>
#include <string>
#include <thread>
#include <vector>

namespace
{
/// A loop that is created, run and destroyed on a thread of its own.
class LoopThread
{
public:
    LoopThread()
        : m_thread(
              [this]
              {
                  TYEventLoop loop;
                  m_promise.set_value(&loop);
                  loop.run();
              })
        , m_loop(m_promise.get_future().get())
    {
    }
    ~LoopThread()
    {
        m_loop->stop();
        m_thread.join();
    }
    LoopThread(LoopThread const&) = delete;
    LoopThread& operator=(LoopThread const&) = delete;

    TYEventLoop& loop() { return *m_loop; }
    std::thread::id id() const { return m_thread.get_id(); }

private:
    std::promise<TYEventLoop*> m_promise;
    std::thread m_thread;
    TYEventLoop* m_loop;
};

/// Sleeps until work is pending.
void AWAIT_WORK(TYEventLoop& loop)
{
    pollfd polled{loop.getPollFd(), POLLIN, 0};
    ASSERT_EQ(1, poll(&polled, 1, -1));
}

class TYSyncEventTest : public testing::Test
{
protected:
    void TearDown() override { EXPECT_EQ(m_alive, TYEvent::s_numberOfInstances.load()); }
    unsigned int m_alive = TYEvent::s_numberOfInstances.load();
};
} // namespace

TEST_F(TYSyncEventTest, OnTheLoopsOwnThreadTheFunctionRunsAtOnce)
{
    TYEventLoop loop;
    bool hasRun = false;
    EXPECT_TRUE(loop.getSyncEvent(EventPrio::LOW).execute([&] { hasRun = true; }).isOk());
    EXPECT_TRUE(hasRun);
    EXPECT_FALSE(loop.runTurn()); // nothing was posted
}

TEST_F(TYSyncEventTest, InsideAHandlerTheFunctionRunsAtOnceToo)
{
    LoopThread thread;
    std::string order;
    EXPECT_TRUE(thread.loop()
                    .getSyncEvent(EventPrio::NORMAL)
                    .execute(
                        [&]
                        {
                            order += 'a';
                            EXPECT_TRUE(
                                thread.loop().getSyncEvent(EventPrio::LOW).execute([&] { order += 'b'; }).isOk());
                            order += 'c';
                        })
                    .isOk());
    EXPECT_EQ("abc", order);
}

TEST_F(TYSyncEventTest, AnotherThreadWaitsUntilTheLoopHasRunTheFunction)
{
    LoopThread thread;
    for (unsigned int priority = 0; priority < EventPrio::COUNT; ++priority)
    {
        std::thread::id ranOn;
        EXPECT_TRUE(thread.loop()
                        .getSyncEvent(static_cast<EventPrio::Type>(priority))
                        .execute([&] { ranOn = std::this_thread::get_id(); })
                        .isOk());
        EXPECT_EQ(thread.id(), ranOn) << priority;
    }
}

TEST_F(TYSyncEventTest, TheFunctionTakesItsPlaceAmongTheEventsOfItsPriority)
{
    TYEventLoop loop;
    std::string order;
    std::thread caller([&]
                       { EXPECT_TRUE(loop.getSyncEvent(EventPrio::NORMAL).execute([&] { order += 's'; }).isOk()); });
    AWAIT_WORK(loop);

    struct Noted
    {
        std::string& order;
        char letter;
        static void RUN(void* argument)
        {
            auto* const noted = static_cast<Noted*>(argument);
            noted->order += noted->letter;
        }
    };
    Noted low{order, 'l'};
    Noted normal{order, 'n'};
    Noted high{order, 'h'};
    TYEvent* const events[] = {new TYEvent(loop, EventPrio::LOW, Noted::RUN, &low),
                               new TYEvent(loop, EventPrio::NORMAL, Noted::RUN, &normal),
                               new TYEvent(loop, EventPrio::HIGH, Noted::RUN, &high)};
    for (TYEvent* const event : events)
        EXPECT_TRUE(event->setIfNotPending().isOk());
    EXPECT_TRUE(loop.runTurn());
    caller.join();
    EXPECT_EQ("hsnl", order);
    for (TYEvent* const event : events)
        event->destroy();
}

TEST_F(TYSyncEventTest, WhatTheFunctionReturnsThroughItsCapturesIsSeenByTheCaller)
{
    LoopThread thread;
    std::vector<int> values; // touched by both threads, ordered by the event alone
    for (int i = 0; i < 100; ++i)
    {
        values.push_back(i);
        EXPECT_TRUE(thread.loop().getSyncEvent(EventPrio::HIGH).execute([&] { values.push_back(-i); }).isOk());
    }
    EXPECT_EQ(200U, values.size());
    EXPECT_EQ(-99, values.back());
}

TEST_F(TYSyncEventTest, SeveralThreadsUseOneEventAtOnce)
{
    unsigned int count = 0; // by the loop's thread alone
    {
        LoopThread thread;
        std::vector<std::thread> callers;
        for (unsigned int i = 0; i < 4; ++i)
            callers.emplace_back(
                [&]
                {
                    for (unsigned int j = 0; j < 200; ++j)
                        EXPECT_TRUE(thread.loop().getSyncEvent(EventPrio::HIGH).execute([&] { ++count; }).isOk());
                });
        for (std::thread& caller : callers)
            caller.join();
    }
    EXPECT_EQ(800U, count);
}

TEST_F(TYSyncEventTest, EventsAreCreatedPostedAndDestroyedThroughIt)
{
    LoopThread thread;
    TYSyncEvent& sync = thread.loop().getSyncEvent(EventPrio::LOW);
    unsigned int runs = 0;
    TYEvent* event = nullptr;
    EXPECT_TRUE(sync.execute(
                        [&]
                        {
                            event = new TYEvent(
                                thread.loop(), EventPrio::HIGH,
                                [](void* argument) { ++*static_cast<unsigned int*>(argument); }, &runs);
                        })
                    .isOk());
    EXPECT_TRUE(event->setIfNotPending().isOk()); // from here, while the loop runs
    unsigned int runsThen = 0;
    EXPECT_TRUE(sync.execute(
                        [&]
                        {
                            runsThen = runs; // the event's priority came first
                            event->destroy();
                        })
                    .isOk());
    EXPECT_EQ(1U, runsThen);
}

TEST_F(TYSyncEventTest, ACallerThatWaitsFailsWhenTheLoopEnds)
{
    for (unsigned int priority = 0; priority < EventPrio::COUNT; ++priority)
    {
        std::optional<TYEventLoop> loop(std::in_place);
        TYSyncEvent& sync = loop->getSyncEvent(static_cast<EventPrio::Type>(priority));
        bool hasRun = false;
        std::thread caller([&] { EXPECT_EQ(XCode::FAILURE, sync.execute([&] { hasRun = true; })); });
        AWAIT_WORK(*loop);
        loop.reset(); // waits until the caller is out of it
        caller.join();
        EXPECT_FALSE(hasRun);
    }
}

TEST_F(TYSyncEventTest, AStoppedLoopLetsItsCallersWaitUntilItRunsAgain)
{
    TYEventLoop loop;
    bool hasRun = false;
    loop.stop();
    std::thread caller([&] { EXPECT_TRUE(loop.getSyncEvent(EventPrio::HIGH).execute([&] { hasRun = true; }).isOk()); });
    AWAIT_WORK(loop);
    loop.run(); // ends at once
    EXPECT_FALSE(hasRun);
    EXPECT_TRUE(loop.runTurn());
    caller.join();
    EXPECT_TRUE(hasRun);
}
