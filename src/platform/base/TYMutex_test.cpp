#include "platform/base/TYMutex.h"

#include <gtest/gtest.h>
#include <thread>
#include <vector>

namespace
{
class RecordingMutex
{
public:
    void lock() { ++m_locks; }
    void unlock() { ++m_unlocks; }
    unsigned int m_locks = 0;
    unsigned int m_unlocks = 0;
};
} // namespace

TEST(TYMutex, ThreadsExcludeOneAnother)
{
    TYMutex mutex;
    unsigned int count = 0;
    std::vector<std::thread> threads;
    for (unsigned int i = 0; i < 4; ++i)
        threads.emplace_back(
            [&]
            {
                for (unsigned int j = 0; j < 10000; ++j)
                {
                    TYAutoLock<TYMutex> const lock(mutex);
                    ++count;
                }
            });
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(40000U, count);
}

TEST(TYMutex, ARecursiveOneMayBeLockedAgainByItsHolder)
{
    TYMutex mutex(1);
    unsigned int depth = 0;
    {
        TYAutoLock<TYMutex> const outer(mutex);
        TYAutoLock<TYMutex> const inner(mutex);
        depth = 2;
    }
    std::thread(
        [&]
        {
            TYAutoLock<TYMutex> const free(mutex); // given up as often as it was taken
            ++depth;
        })
        .join();
    EXPECT_EQ(3U, depth);
}

TEST(TYMutex, AnAutoLockHoldsWhileItLives)
{
    RecordingMutex mutex;
    {
        TYAutoLock<RecordingMutex> const lock(mutex);
        EXPECT_EQ(1U, mutex.m_locks);
        EXPECT_EQ(0U, mutex.m_unlocks);
    }
    EXPECT_EQ(1U, mutex.m_locks);
    EXPECT_EQ(1U, mutex.m_unlocks);
}
