#include "callcontrol/CC_CallPool.h"

#include "testing/DrivenClock.h"
#include "testing/DrivenLoop.h"

#include <chrono>
#include <future>
#include <gtest/gtest.h>

namespace
{
using Statistics = CC_CallPool::Statistics;

/// The statistics of the process are never reset: tests look at a set of their own, and restart the one clock.
class CC_CallPoolStatistics_Test : public testing::Test
{
protected:
    CC_CallPoolStatistics_Test() { Statistics::s_tLastUpdate = TY::Time(); }
    ~CC_CallPoolStatistics_Test() override { Statistics::s_tLastUpdate = TY::Time(); }

    void add(unsigned int calls)
    {
        while (calls-- > 0)
            m_statistics.onCallAdded();
    }
    void remove(unsigned int calls)
    {
        while (calls-- > 0)
            m_statistics.onCallRemoved();
    }
    unsigned long long callTime()
    {
        m_statistics.prepareGet();
        return m_statistics.m_callTime;
    }

    DrivenClock m_clock;
    Statistics m_statistics;
};
} // namespace

TEST_F(CC_CallPoolStatistics_Test, BeginsWithZeros)
{
    EXPECT_EQ(m_statistics.m_callsAdded, 0u);
    EXPECT_EQ(m_statistics.m_callsRemoved, 0u);
    EXPECT_EQ(m_statistics.m_callTime, 0u);
    EXPECT_EQ(m_statistics.m_maxActiveCalls, 0u);
}

TEST_F(CC_CallPoolStatistics_Test, CountsAddedAndRemovedCalls)
{
    add(3);
    remove(2);
    EXPECT_EQ(m_statistics.m_callsAdded, 3u);
    EXPECT_EQ(m_statistics.m_callsRemoved, 2u);
}

TEST_F(CC_CallPoolStatistics_Test, TwoCallsFor1500MillisecondsAre3000)
{
    add(2);
    m_clock.advance(1500);
    remove(2);
    EXPECT_EQ(m_statistics.m_callTime, 3000u);
}

TEST_F(CC_CallPoolStatistics_Test, EachStretchCountsWithItsOwnNumberOfCalls)
{
    add(1);
    m_clock.advance(1000);
    add(1);
    m_clock.advance(1000);
    remove(1);
    m_clock.advance(1000);
    remove(1);
    m_clock.advance(1000);
    EXPECT_EQ(callTime(), 1000u + 2000u + 1000u);
}

TEST_F(CC_CallPoolStatistics_Test, TheFirstUpdateOnlyStartsTheClock)
{
    m_statistics.m_callsAdded = 5; // as if calls had been up since the start-up of the clock
    m_statistics.updateCallTime();
    EXPECT_EQ(m_statistics.m_callTime, 0u);
    EXPECT_EQ(Statistics::s_tLastUpdate, m_clock.getTime());
    m_clock.advance(10);
    m_statistics.updateCallTime();
    EXPECT_EQ(m_statistics.m_callTime, 50u);
}

TEST_F(CC_CallPoolStatistics_Test, AClockInItsFirstSecondIsTakenForOneNotStarted)
{
    m_clock.set(TY::Time{0, 500000000});
    add(1);
    m_clock.set(TY::Time{2, 0});
    EXPECT_EQ(callTime(), 0u) << "seconds of 0 stand for a clock that was never read";
    m_clock.set(TY::Time{3, 0});
    EXPECT_EQ(callTime(), 1000u);
}

TEST_F(CC_CallPoolStatistics_Test, ElapsedTimeBorrowsFromTheSeconds)
{
    struct Case
    {
        TY::Time from;
        TY::Time to;
        unsigned long long milliseconds;
    };
    Case const cases[] = {
        {{1000, 900000000}, {1001, 100000000}, 200}, // nanoseconds go down: a second is borrowed
        {{1000, 999999999}, {1001, 0}, 0},           // one nanosecond: less than a millisecond
        {{1000, 1}, {1001, 0}, 999},                 // truncated, not rounded
        {{1000, 0}, {1000, 1999999}, 1},             // truncated
        {{1000, 0}, {1001, 500000000}, 1500},        // nothing to borrow
        {{1, 0}, {5000001, 0}, 5000000000ULL},       // more milliseconds than 32 bits hold
    };
    for (Case const& row : cases)
    {
        Statistics statistics;
        Statistics::s_tLastUpdate = TY::Time();
        m_clock.set(row.from);
        statistics.onCallAdded();
        m_clock.set(row.to);
        statistics.prepareGet();
        EXPECT_EQ(statistics.m_callTime, row.milliseconds)
            << row.from.seconds << "." << row.from.nanoseconds << " to " << row.to.seconds << "." << row.to.nanoseconds;
    }
}

TEST_F(CC_CallPoolStatistics_Test, MillisecondsAreTruncatedAtEachUpdate)
{
    add(1);
    for (int i = 0; i < 4; ++i)
    {
        TY::Time now = m_clock.getTime();
        now.nanoseconds += 1900000;
        m_clock.set(now);
        m_statistics.prepareGet();
    }
    EXPECT_EQ(m_statistics.m_callTime, 4u) << "7.6 ms in four updates";
}

TEST_F(CC_CallPoolStatistics_Test, AClockThatWasSetBackTakesItsTimeOffAgain)
{
    add(2);
    m_clock.advance(5000);
    EXPECT_EQ(callTime(), 10000u);
    m_clock.advance(-1500);
    EXPECT_EQ(callTime(), 7000u);
    m_clock.advance(1500);
    EXPECT_EQ(callTime(), 10000u);
}

TEST_F(CC_CallPoolStatistics_Test, TheMaximumIsTheMostCallsAtOnce)
{
    add(2);
    remove(1);
    add(1);
    EXPECT_EQ(m_statistics.m_maxActiveCalls, 2u);
    add(3);
    remove(5);
    EXPECT_EQ(m_statistics.m_maxActiveCalls, 5u);
}

TEST_F(CC_CallPoolStatistics_Test, AResetMaximumStartsFromThePresentCalls)
{
    add(3);
    remove(1);
    m_statistics.resetMax();
    EXPECT_EQ(m_statistics.m_maxActiveCalls, 0u);
    m_statistics.prepareGet();
    EXPECT_EQ(m_statistics.m_maxActiveCalls, 2u);
    EXPECT_EQ(m_statistics.m_callsAdded, 3u) << "the counts go on";
    EXPECT_EQ(m_statistics.m_callsRemoved, 1u);
}

TEST_F(CC_CallPoolStatistics_Test, RemovingDoesNotTouchTheMaximum)
{
    add(2);
    m_statistics.resetMax();
    remove(1);
    EXPECT_EQ(m_statistics.m_maxActiveCalls, 0u);
}

TEST_F(CC_CallPoolStatistics_Test, TheLockGuardsAllButTheReset)
{
    using namespace std::chrono_literals;
    std::future<void> waiting;
    {
        TYAutoLock<TYMutex> const lock(Statistics::s_mutex);
        m_statistics.m_maxActiveCalls = 7;
        m_statistics.resetMax(); // would never come back if it took the lock
        EXPECT_EQ(m_statistics.m_maxActiveCalls, 0u);
        waiting = std::async(std::launch::async,
                             [this]
                             {
                                 m_statistics.onCallAdded();
                                 m_statistics.onCallRemoved();
                                 m_statistics.prepareGet();
                             });
        EXPECT_EQ(waiting.wait_for(20ms), std::future_status::timeout);
    }
    waiting.get();
    EXPECT_EQ(m_statistics.m_callsAdded, 1u);
    EXPECT_EQ(m_statistics.m_callsRemoved, 1u);
}

TEST_F(CC_CallPoolStatistics_Test, AllPoolsFeedTheOneSetOfTheProcess)
{
    DrivenLoop loop;
    Statistics const before = CC_CallPool::s_statistics;
    CC_CallPool first;
    CC_CallPool second;
    CC_Call* const a = first.acquireCall();
    CC_Call* const b = second.acquireCall();
    m_clock.advance(1500);
    first.releaseCall(a);
    second.releaseCall(b);
    Statistics const& after = CC_CallPool::s_statistics;
    EXPECT_EQ(after.m_callsAdded - before.m_callsAdded, 2u);
    EXPECT_EQ(after.m_callsRemoved - before.m_callsRemoved, 2u);
    EXPECT_EQ(after.m_callTime - before.m_callTime, 3000u);
}

TEST_F(CC_CallPoolStatistics_Test, ThePoolsOwnMomentIsNotUsed)
{
    DrivenLoop loop;
    CC_CallPool pool;
    pool.releaseCall(pool.acquireCall());
    EXPECT_EQ(CC_CallPool::s_tLastUpdate, TY::Time());
}
