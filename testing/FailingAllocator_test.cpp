#include "testing/FailingAllocator.h"

#include "platform/base/String.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "testing/Hook.h"
#include "testing/Journal.h"
#include "testing/RecordingMonitor.h"

#include <cstdint>
#include <gtest/gtest.h>
#include <memory>
#include <new>
#include <string>
#include <thread>
#include <vector>

namespace
{
/// Keeps the compiler from leaving out an allocation that nobody uses.
void* volatile s_sink;

bool ALLOCATES()
{
    int* const memory = new (std::nothrow) int;
    s_sink = memory;
    delete memory;
    return memory != nullptr;
}

/// Which of so many allocations failed, when the n-th was to.
std::vector<bool> OUTCOMES(unsigned long n, std::size_t allocations)
{
    std::vector<bool> outcomes(allocations);
    FailingAllocator::failNth(n);
    for (std::size_t i = 0; i < allocations; ++i)
        outcomes[i] = ALLOCATES();
    FailingAllocator::stop();
    return outcomes;
}

/// Whether the form throws std::bad_alloc when its allocation is the one to fail.
template <class Allocate>
bool THROWS(Allocate&& allocate)
{
    bool hasThrown = false;
    FailingAllocator::failNth(1);
    try
    {
        allocate();
    }
    catch (std::bad_alloc const&)
    {
        hasThrown = true;
    }
    FailingAllocator::stop();
    return hasThrown;
}

struct alignas(64) Aligned
{
    char bytes[64];
};
} // namespace

TEST(FailingAllocator, ExactlyTheNthAllocationFails)
{
    EXPECT_EQ(OUTCOMES(1, 4), (std::vector<bool>{false, true, true, true}));
    EXPECT_EQ(OUTCOMES(2, 4), (std::vector<bool>{true, false, true, true}));
    EXPECT_EQ(OUTCOMES(4, 4), (std::vector<bool>{true, true, true, false}));
}

TEST(FailingAllocator, AnNthThatIsNotReachedFailsNothing)
{
    EXPECT_EQ(OUTCOMES(5, 4), (std::vector<bool>{true, true, true, true}));
    EXPECT_FALSE(FailingAllocator::hasFailed());
    EXPECT_EQ(FailingAllocator::count(), 4u);
    EXPECT_TRUE(ALLOCATES()) << "the fifth comes after stop()";
}

TEST(FailingAllocator, ZeroOnlyCounts)
{
    EXPECT_EQ(OUTCOMES(0, 3), (std::vector<bool>{true, true, true}));
    EXPECT_EQ(FailingAllocator::count(), 3u);
    EXPECT_FALSE(FailingAllocator::hasFailed());
}

TEST(FailingAllocator, TheCountBeginsAgainWithEachChoice)
{
    OUTCOMES(2, 4);
    EXPECT_EQ(FailingAllocator::count(), 4u) << "the failed one counts";
    EXPECT_TRUE(FailingAllocator::hasFailed());
    FailingAllocator::failNth(7);
    unsigned long const count = FailingAllocator::count();
    bool const hasFailed = FailingAllocator::hasFailed();
    FailingAllocator::stop();
    EXPECT_EQ(count, 0u);
    EXPECT_FALSE(hasFailed);
}

TEST(FailingAllocator, ThrowingFormsThrow)
{
    EXPECT_TRUE(THROWS([] { s_sink = new int; }));
    EXPECT_TRUE(THROWS([] { s_sink = new int[8]; }));
    EXPECT_TRUE(THROWS([] { s_sink = new Aligned; }));
    EXPECT_TRUE(THROWS([] { s_sink = new Aligned[2]; }));
    EXPECT_TRUE(THROWS([] { s_sink = ::operator new(10); }));
}

TEST(FailingAllocator, NothrowFormsGiveNull)
{
    EXPECT_FALSE(THROWS([] { s_sink = new (std::nothrow) int; }));
    EXPECT_EQ(s_sink, nullptr);
    EXPECT_FALSE(THROWS([] { s_sink = new (std::nothrow) int[8]; }));
    EXPECT_EQ(s_sink, nullptr);
    EXPECT_FALSE(THROWS([] { s_sink = new (std::nothrow) Aligned; }));
    EXPECT_EQ(s_sink, nullptr);
    EXPECT_FALSE(THROWS([] { s_sink = new (std::nothrow) Aligned[2]; }));
    EXPECT_EQ(s_sink, nullptr);
}

TEST(FailingAllocator, MemoryThatIsGivenIsAligned)
{
    auto const aligned = std::make_unique<Aligned>();
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(aligned.get()) % 64, 0u);
}

TEST(FailingAllocator, ReachesTheAllocationsOfTheLibraries)
{
    CC_PropertyBoolean const property(CC_PropertyId::PROVIDES_DATA);
    FailingAllocator::failNth(1);
    CC_Property* const refused = property.clone();
    CC_Property* const second = property.clone();
    FailingAllocator::stop();
    EXPECT_EQ(refused, nullptr);
    EXPECT_NE(second, nullptr);
    delete second;
}

TEST(FailingAllocator, AThreadInAPauseNeitherCountsNorFails)
{
    FailingAllocator::failNth(1);
    bool inPause = false;
    {
        FailingAllocator::Pause const outer;
        {
            FailingAllocator::Pause const inner;
        }
        inPause = ALLOCATES();
    }
    unsigned long const count = FailingAllocator::count();
    bool const afterPause = ALLOCATES();
    FailingAllocator::stop();
    EXPECT_TRUE(inPause);
    EXPECT_EQ(count, 0u);
    EXPECT_FALSE(afterPause);
}

TEST(FailingAllocator, APauseIsItsThreadsOwn)
{
    bool other = true;
    std::thread thread;
    {
        FailingAllocator::Pause const pause;
        FailingAllocator::failNth(1);
        thread = std::thread(
            [&]
            {
                other = ALLOCATES();
                FailingAllocator::stop();
            });
        thread.join();
    }
    EXPECT_FALSE(other);
}

TEST(FailingAllocator, TheKitsOwnWorkDoesNotCount)
{
    Journal journal;
    RecordingMonitor monitor;
    Hook<void()> hook;
    std::string const large(200, 'x');
    hook = [large] { s_sink = nullptr; };
    FailingAllocator::failNth(1);
    {
        FailingAllocator::Pause const pause;
        journal.add(large);
    }
    monitor.write(CC_Monitor::ID, RTD::LEVEL_FLOW, large.c_str());
    hook();
    unsigned long const count = FailingAllocator::count();
    FailingAllocator::stop();
    EXPECT_EQ(count, 0u);
    EXPECT_EQ(journal.getLines().size(), 1u);
    EXPECT_TRUE(monitor.contains(large));
}
