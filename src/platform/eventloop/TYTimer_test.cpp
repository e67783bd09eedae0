#include "platform/eventloop/TYTimer.h"

#include "platform/eventloop/TYEvent.h"
#include "platform/eventloop/TYEventLoop.h"
#include "testing/DrivenClock.h"

#include <climits>
#include <functional>
#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <optional>
#include <poll.h>
#include <random>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace
{
/// A timer whose work is a function.
class Timer
{
public:
    Timer(TYEventLoop& loop, std::function<void()> work, EventPrio::Type priority = EventPrio::HIGH)
        : m_work(std::move(work)), m_timer(std::in_place, loop, priority, RUN, this)
    {
    }
    Timer(Timer const&) = delete;
    Timer& operator=(Timer const&) = delete;

    TYTimer* operator->() { return &*m_timer; }
    void destroy() { m_timer.reset(); }

private:
    static void RUN(void* argument) { static_cast<Timer*>(argument)->m_work(); }
    std::function<void()> m_work;
    std::optional<TYTimer> m_timer;
};

bool IS_READABLE(int fd, int timeout = 0)
{
    pollfd polled{fd, POLLIN, 0};
    return poll(&polled, 1, timeout) == 1;
}

class TYTimerTest : public testing::Test
{
protected:
    std::function<void()> note(char letter)
    {
        return [this, letter] { m_order += letter; };
    }
    /// What runs when so many milliseconds have passed.
    std::string after(long long milliseconds)
    {
        m_clock->advance(milliseconds);
        m_order.clear();
        bool const hadWork = m_loop->runTurn();
        EXPECT_EQ(hadWork, !m_order.empty());
        return m_order;
    }

    std::optional<DrivenClock> m_clock{std::in_place};
    std::optional<TYEventLoop> m_loop{std::in_place};
    std::string m_order;
};
} // namespace

TEST_F(TYTimerTest, ATimerRunsOnceWhenItsTimeHasComeAndNotBefore)
{
    Timer timer(*m_loop, note('t'));
    EXPECT_FALSE(timer->isRunning());
    timer->start(100);
    EXPECT_TRUE(timer->isRunning());
    EXPECT_EQ("", after(0));
    EXPECT_EQ("", after(99));
    EXPECT_EQ("t", after(1));
    EXPECT_FALSE(timer->isRunning());
    EXPECT_EQ("", after(1000));
}

TEST_F(TYTimerTest, ATimerNeverRunsAPartOfAMillisecondEarly)
{
    Timer timer(*m_loop, note('t'));
    m_clock->set({7, 999999});
    timer->start(1);
    m_clock->set({7, 1999998});
    EXPECT_EQ("", after(0));
    m_clock->set({7, 1999999});
    EXPECT_EQ("t", after(0));
}

TEST_F(TYTimerTest, ATimerOfNoTimeRunsInTheNextTurn)
{
    Timer timer(*m_loop, note('t'));
    timer->start(0);
    EXPECT_EQ("t", after(0));
    EXPECT_EQ("", after(0));
}

TEST_F(TYTimerTest, TheLongestTimeIs49Days)
{
    Timer timer(*m_loop, note('t'));
    timer->start(UINT_MAX);
    EXPECT_EQ("", after(UINT_MAX - 1LL));
    EXPECT_EQ("t", after(1));
}

TEST_F(TYTimerTest, StartingATimerThatRunsBeginsAnew)
{
    Timer timer(*m_loop, note('t'));
    timer->start(100);
    EXPECT_EQ("", after(60));
    timer->start(100);
    EXPECT_EQ("", after(60));
    EXPECT_EQ("t", after(40));
    EXPECT_EQ("", after(100));
}

TEST_F(TYTimerTest, AStoppedTimerDoesNotRun)
{
    Timer timer(*m_loop, note('t'));
    timer->stop(); // nothing to stop
    timer->start(100);
    timer->stop();
    EXPECT_FALSE(timer->isRunning());
    timer->stop();
    EXPECT_EQ("", after(100));
    timer->start(5);
    EXPECT_EQ("t", after(5));
}

TEST_F(TYTimerTest, TimersRunInTheOrderOfTheirTimesAndThenOfTheirStarts)
{
    Timer a(*m_loop, note('a'));
    Timer b(*m_loop, note('b'));
    Timer c(*m_loop, note('c'));
    Timer d(*m_loop, note('d'));
    a->start(30);
    b->start(10);
    c->start(20);
    d->start(10);
    b->start(10); // again, so after d
    EXPECT_EQ("dbca", after(30));
}

TEST_F(TYTimerTest, InATurnLowerPriorityValuesRunFirstAndTimersBeforeEvents)
{
    Timer low(*m_loop, note('L'), EventPrio::LOW);
    Timer high(*m_loop, note('H'), EventPrio::HIGH);
    Timer highest(*m_loop, note('X'), EventPrio::HIGHEST);
    std::vector<TYEvent*> events;
    auto const noteEvent = [this, &events](EventPrio::Type priority, std::function<void()>& work)
    {
        events.push_back(new TYEvent(
            *m_loop, priority, [](void* argument) { (*static_cast<std::function<void()>*>(argument))(); }, &work));
        EXPECT_TRUE(events.back()->setIfNotPending().isOk());
    };
    std::function<void()> lowWork = note('l'), normalWork = note('n'), highWork = note('h');
    noteEvent(EventPrio::LOW, lowWork);
    noteEvent(EventPrio::NORMAL, normalWork);
    noteEvent(EventPrio::HIGH, highWork);
    low->start(1);
    high->start(2);
    highest->start(3);
    EXPECT_EQ("XHhnLl", after(3));
    for (TYEvent* const event : events)
        event->destroy();
}

TEST_F(TYTimerTest, WhatIsStartedDuringATurnRunsInALaterOne)
{
    Timer other(*m_loop, note('o'));
    Timer timer(*m_loop,
                [&]
                {
                    m_order += 't';
                    other->start(0);
                    timer->start(0);
                });
    timer->start(1);
    EXPECT_EQ("t", after(1));
    timer->stop();
    EXPECT_EQ("o", after(0));
}

TEST_F(TYTimerTest, ATimerCanBeStartedAgainInItsOwnHandler)
{
    Timer timer(*m_loop,
                [&]
                {
                    EXPECT_FALSE(timer->isRunning());
                    m_order += 't';
                    timer->start(10);
                });
    timer->start(10);
    EXPECT_EQ("t", after(10));
    EXPECT_EQ("", after(9));
    EXPECT_EQ("t", after(1));
}

TEST_F(TYTimerTest, ATimerCanBeDestroyedInItsOwnHandler)
{
    std::unique_ptr<TYTimer> timer;
    auto const destroy = [](void* argument) { static_cast<std::unique_ptr<TYTimer>*>(argument)->reset(); };
    timer = std::make_unique<TYTimer>(*m_loop, EventPrio::HIGH, destroy, &timer);
    timer->start(1);
    m_clock->advance(1);
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ(nullptr, timer);

    timer = std::make_unique<TYTimer>(*m_loop, EventPrio::HIGH, destroy, &timer);
    EXPECT_TRUE(timer->startPeriodic(1).isOk());
    m_clock->advance(1);
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ(nullptr, timer);
    m_clock->advance(1);
    EXPECT_FALSE(m_loop->runTurn());
}

TEST_F(TYTimerTest, ATimerThatIsDueDoesNotRunWhenAnEarlierHandlerStopsOrDestroysIt)
{
    Timer stopped(*m_loop, note('s'));
    Timer destroyed(*m_loop, note('d'));
    Timer restarted(*m_loop, note('r'));
    Timer first(*m_loop,
                [&]
                {
                    m_order += 'f';
                    stopped->stop();
                    destroyed.destroy();
                    EXPECT_TRUE(restarted->isRunning());
                    restarted->start(5);
                });
    first->start(1);
    stopped->start(2);
    destroyed->start(2);
    restarted->start(2);
    EXPECT_EQ("f", after(2));
    EXPECT_EQ("r", after(5));
}

TEST_F(TYTimerTest, ATimerCanDestroyTheEventThatWouldRunNext)
{
    TYEvent* event = new TYEvent(
        *m_loop, EventPrio::HIGH, [](void* argument) { *static_cast<std::string*>(argument) += 'e'; }, &m_order);
    Timer timer(*m_loop,
                [&]
                {
                    m_order += 't';
                    event->destroy();
                });
    EXPECT_TRUE(event->setIfNotPending().isOk());
    timer->start(1);
    EXPECT_EQ("t", after(1));
}

TEST_F(TYTimerTest, APeriodicTimerRunsAtMultiplesOfItsPeriod)
{
    Timer timer(*m_loop, note('p'));
    EXPECT_TRUE(timer->startPeriodic(20).isOk());
    EXPECT_EQ("", after(19));
    EXPECT_EQ("p", after(8)); // at 27, 7 late
    EXPECT_TRUE(timer->isRunning());
    EXPECT_EQ("", after(12));
    EXPECT_EQ("p", after(1)); // at 40 all the same
    EXPECT_EQ(0U, timer->getNumberOfMissed());
    timer->stop();
    EXPECT_EQ("", after(100));
}

TEST_F(TYTimerTest, APeriodicTimerOfALateLoopRunsOnceAndCountsWhatItMissed)
{
    Timer timer(*m_loop, note('p'));
    EXPECT_TRUE(timer->startPeriodic(20).isOk());
    EXPECT_EQ("p", after(105)); // 20 late by four periods and 5
    EXPECT_EQ(4U, timer->getNumberOfMissed());
    EXPECT_EQ("", after(14));
    EXPECT_EQ("p", after(1)); // at 120
    EXPECT_EQ(4U, timer->getNumberOfMissed());
    EXPECT_EQ("p", after(40)); // at 160, exactly two periods on
    EXPECT_EQ(5U, timer->getNumberOfMissed());
    EXPECT_TRUE(timer->startPeriodic(20).isOk());
    EXPECT_EQ(0U, timer->getNumberOfMissed());
}

TEST_F(TYTimerTest, AHandlerThatTakesLongerThanThePeriodDoesNotMakeItRunTwice)
{
    Timer timer(*m_loop,
                [&]
                {
                    m_order += 'p';
                    m_clock->advance(35);
                });
    EXPECT_TRUE(timer->startPeriodic(10).isOk());
    EXPECT_EQ("p", after(10)); // until 45
    EXPECT_EQ("p", after(0));  // the time 40, for those of 20 and 30 too
    EXPECT_EQ(2U, timer->getNumberOfMissed());
}

TEST_F(TYTimerTest, APeriodOfNothingIsRefusedAndLeavesTheTimerAsItWas)
{
    Timer timer(*m_loop, note('t'));
    timer->start(5);
    EXPECT_EQ(XCode::REFUSED, timer->startPeriodic(0));
    EXPECT_EQ("t", after(5));
    EXPECT_EQ("", after(5));
}

TEST_F(TYTimerTest, APeriodicTimerStopsOrChangesInItsOwnHandler)
{
    Timer stopping(*m_loop,
                   [&]
                   {
                       m_order += 's';
                       EXPECT_TRUE(stopping->isRunning());
                       stopping->stop();
                   });
    Timer changing(*m_loop,
                   [&]
                   {
                       m_order += 'c';
                       changing->start(3);
                   });
    EXPECT_TRUE(stopping->startPeriodic(10).isOk());
    EXPECT_TRUE(changing->startPeriodic(10).isOk());
    EXPECT_EQ("sc", after(10));
    EXPECT_EQ("c", after(3));
    EXPECT_EQ("", after(2));
}

TEST_F(TYTimerTest, ThousandsOfTimersRunInOrderWhateverIsStartedAndStopped)
{
    constexpr unsigned int TIMERS = 5000;
    std::vector<unsigned int> ran;
    std::vector<std::unique_ptr<Timer>> timers;
    for (unsigned int i = 0; i < TIMERS; ++i)
        timers.push_back(std::make_unique<Timer>(*m_loop, [&ran, i] { ran.push_back(i); }));

    std::mt19937 random(1);
    using Moment = std::pair<unsigned int, unsigned int>; // due, number of the start
    std::map<Moment, unsigned int> expected;
    std::vector<Moment> moments(TIMERS);
    unsigned int starts = 0;
    unsigned int now = 0;
    for (unsigned int round = 0; round < 200; ++round)
    {
        for (unsigned int i = 0; i < 300; ++i)
        {
            unsigned int const number = static_cast<unsigned int>(random() % TIMERS);
            expected.erase(moments[number]);
            if (random() % 4 == 0)
                (*timers[number])->stop();
            else
            {
                unsigned int const milliseconds = static_cast<unsigned int>(random() % 500);
                (*timers[number])->start(milliseconds);
                moments[number] = {now + milliseconds, ++starts};
                expected[moments[number]] = number;
            }
        }
        unsigned int const step = static_cast<unsigned int>(random() % 20);
        now += step;
        m_clock->advance(step);
        ran.clear();
        m_loop->runTurn();
        std::vector<unsigned int> due;
        while (!expected.empty() && expected.begin()->first.first <= now)
        {
            due.push_back(expected.begin()->second);
            expected.erase(expected.begin());
        }
        ASSERT_EQ(due, ran) << round;
    }
    EXPECT_GT(expected.size(), 1000U);
}

TEST_F(TYTimerTest, TheTimeoutIsThatOfTheNextTimerRoundedUp)
{
    EXPECT_EQ(-1, m_loop->getTimeout());
    Timer later(*m_loop, [] {});
    Timer sooner(*m_loop, [] {});
    later->start(70);
    EXPECT_EQ(70, m_loop->getTimeout());
    sooner->start(30);
    EXPECT_EQ(30, m_loop->getTimeout());
    TY::Time const now = m_clock->getTime();
    m_clock->set({now.seconds, now.nanoseconds + 1});
    EXPECT_EQ(30, m_loop->getTimeout());
    m_clock->set({now.seconds, now.nanoseconds + 30000000});
    EXPECT_EQ(0, m_loop->getTimeout());
    m_clock->advance(1);
    EXPECT_EQ(0, m_loop->getTimeout());
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_EQ(39, m_loop->getTimeout());
    later->start(UINT_MAX);
    EXPECT_EQ(INT_MAX, m_loop->getTimeout());
    later->stop();
    EXPECT_EQ(-1, m_loop->getTimeout());
}

TEST_F(TYTimerTest, TheTimeoutIsNothingWhileAnEventIsPending)
{
    auto* const event = new TYEvent(
        *m_loop, EventPrio::HIGH, [](void*) {}, nullptr);
    EXPECT_TRUE(event->setIfNotPending().isOk());
    EXPECT_EQ(0, m_loop->getTimeout());
    event->destroy();
    EXPECT_EQ(-1, m_loop->getTimeout());
}

TEST_F(TYTimerTest, ThePollDescriptorIsReadableWhileATimerIsDue)
{
    Timer timer(*m_loop, note('t'));
    int const fd = m_loop->getPollFd();
    ASSERT_GE(fd, 0);
    timer->start(60000);
    EXPECT_FALSE(IS_READABLE(m_loop->getPollFd()));
    m_clock->advance(60000);
    EXPECT_EQ(fd, m_loop->getPollFd());
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_EQ("t", after(0));
    EXPECT_FALSE(IS_READABLE(m_loop->getPollFd()));
}

TEST_F(TYTimerTest, ThePollDescriptorTellsOfATimerOfNoTimeAtOnce)
{
    Timer timer(*m_loop, note('t'));
    Timer starting(*m_loop, [&] { timer->start(0); });
    int const fd = m_loop->getPollFd();
    timer->start(0);
    EXPECT_TRUE(IS_READABLE(fd));
    timer->stop();
    EXPECT_FALSE(IS_READABLE(fd));
    starting->start(0);
    EXPECT_TRUE(m_loop->runTurn());
    EXPECT_TRUE(IS_READABLE(fd));
    EXPECT_EQ("t", after(0));
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYTimerTest, ThePollDescriptorKeepsTellingOfWhatRemains)
{
    Timer timer(*m_loop, [] {});
    int const fd = m_loop->getPollFd();
    auto* const event = new TYEvent(
        *m_loop, EventPrio::HIGH, [](void*) {}, nullptr);
    EXPECT_TRUE(event->setIfNotPending().isOk());
    timer->start(0);
    timer->stop();
    EXPECT_TRUE(IS_READABLE(fd)); // of the event
    timer->start(0);
    event->destroy();
    EXPECT_TRUE(IS_READABLE(fd)); // of the timer
    timer->stop();
    EXPECT_FALSE(IS_READABLE(fd));
}

TEST_F(TYTimerTest, APollDescriptorAskedForLateTellsOfATimerThatIsDue)
{
    Timer timer(*m_loop, note('t'));
    timer->start(5);
    m_clock->advance(5);
    EXPECT_TRUE(IS_READABLE(m_loop->getPollFd()));
    EXPECT_EQ("t", after(0));
    EXPECT_FALSE(IS_READABLE(m_loop->getPollFd()));
}

// From here on with the system's clock: waits end by what they wait for, a millisecond later.
TEST_F(TYTimerTest, AHostsLoopIsWokenByTheTimer)
{
    m_clock.reset();
    Timer timer(*m_loop, note('t'));
    Timer early(*m_loop, note('e'));
    timer->start(2); // the descriptor has to know of it also when it is asked for later
    int const fd = m_loop->getPollFd();
    early->start(1);
    while (m_order.size() < 2) // whoever is held up between the two starts finds them in the other order
    {
        EXPECT_TRUE(IS_READABLE(fd, -1));
        m_loop->runTurn();
    }
    EXPECT_FALSE(IS_READABLE(fd));
    m_order.clear();
    EXPECT_TRUE(timer->startPeriodic(1).isOk());
    for (unsigned int i = 0; i < 3; ++i)
    {
        EXPECT_TRUE(IS_READABLE(fd, -1));
        m_loop->runTurn();
    }
    EXPECT_EQ("ttt", m_order);
}

TEST_F(TYTimerTest, AStoppedTimerWakesAHostsLoopOnceAtMost)
{
    m_clock.reset();
    Timer timer(*m_loop, note('t'));
    int const fd = m_loop->getPollFd();
    timer->start(1);
    timer->stop();
    EXPECT_TRUE(IS_READABLE(fd, -1));
    EXPECT_FALSE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));
    EXPECT_EQ("", m_order);
}

TEST_F(TYTimerTest, AHostsLoopDoesNotSpinWhileTheClockIsHeld)
{
    Timer timer(*m_loop, note('t'));
    int const fd = m_loop->getPollFd();
    timer->start(1);
    EXPECT_TRUE(IS_READABLE(fd, -1)); // the system's time goes on
    EXPECT_FALSE(m_loop->runTurn());
    EXPECT_FALSE(IS_READABLE(fd));
    EXPECT_TRUE(IS_READABLE(fd, -1)); // for the same time anew
    EXPECT_EQ("t", after(1));
}

TEST_F(TYTimerTest, ARunningLoopSleepsUntilTheTimer)
{
    m_clock.reset();
    Timer last(*m_loop, [&] { m_loop->stop(); });
    Timer first(*m_loop,
                [&]
                {
                    m_order += 'f';
                    last->start(1);
                });
    first->start(1);
    m_loop->run();
    EXPECT_EQ("f", m_order);
}

TEST_F(TYTimerTest, APostWakesALoopThatSleepsForATimer)
{
    m_clock.reset();
    Timer distant(*m_loop, note('d'));
    distant->start(UINT_MAX);
    auto* const event = new TYEvent(
        *m_loop, EventPrio::HIGH, [](void* loop) { static_cast<TYEventLoop*>(loop)->stop(); }, &*m_loop);
    std::thread poster([&] { EXPECT_TRUE(event->setIfNotPending().isOk()); });
    m_loop->run();
    poster.join();
    event->destroy();
    EXPECT_TRUE(distant->isRunning());
}

TEST_F(TYTimerTest, ATimerThatRunsIsStoppedByTheEndOfItsLoop)
{
    Timer one(*m_loop, note('1'));
    Timer two(*m_loop, note('2'));
    Timer idle(*m_loop, note('i'));
    one->start(1);
    EXPECT_TRUE(two->startPeriodic(1).isOk());
    m_loop.reset();
    EXPECT_FALSE(one->isRunning());
    EXPECT_FALSE(two->isRunning());
}

#ifndef NDEBUG
TEST_F(TYTimerTest, AnotherThreadThatStartsOrStopsATimerStopsADebugBuild)
{
    Timer timer(*m_loop, [] {});
    EXPECT_DEATH(std::thread([&] { timer->start(1); }).join(), "started on another thread");
    timer->start(1);
    EXPECT_DEATH(std::thread([&] { timer->stop(); }).join(), "stopped on another thread");
    EXPECT_DEATH(std::thread([&] { timer.destroy(); }).join(), "stopped on another thread");
}
#endif
