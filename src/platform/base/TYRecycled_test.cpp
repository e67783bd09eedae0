#include "platform/base/TYRecycled.h"

#include "testing/FailingAllocator.h"

#include <cstdint>
#include <cstring>
#include <gtest/gtest.h>
#include <memory>
#include <thread>
#include <vector>

namespace
{
struct Small : TYRecycled
{
    virtual ~Small() = default;
    int value = 7;
};

struct Larger : Small
{
    char more[100] = {};
};

struct Odd : TYRecycled
{
    char octets[13];
};

struct Even : TYRecycled
{
    char octets[16];
};

struct alignas(64) Aligned : TYRecycled
{
    char octets[64];
};

struct TooLarge : TYRecycled
{
    char octets[4096];
};

/// Blocks are kept while a test runs, and none are afterwards: as the test main began.
class TYRecycled_Test : public testing::Test
{
protected:
    TYRecycled_Test() { TYRecycled::KEEP_BLOCKS(2); }
    ~TYRecycled_Test() override { TYRecycled::KEEP_BLOCKS(0); }

    /// How many allocations the making of as many objects takes.
    template <class Object>
    static unsigned long allocationsOf(unsigned int objects)
    {
        std::vector<std::unique_ptr<Object>> made(objects);
        FailingAllocator::failNth(0);
        for (auto& object : made)
            object.reset(new Object);
        FailingAllocator::stop();
        return FailingAllocator::count();
    }
};
} // namespace

TEST_F(TYRecycled_Test, AnObjectTakesTheBlockOfOneThatEnded)
{
    EXPECT_EQ(allocationsOf<Small>(1), 1u);
    EXPECT_EQ(allocationsOf<Small>(1), 0u);
}

TEST_F(TYRecycled_Test, ARecycledObjectIsMadeAnew)
{
    auto first = std::make_unique<Small>();
    first->value = 1;
    first.reset();
    EXPECT_EQ(std::make_unique<Small>()->value, 7);
}

TEST_F(TYRecycled_Test, NoMoreThanTheLimitIsKept)
{
    EXPECT_EQ(allocationsOf<Small>(5), 5u);
    EXPECT_EQ(allocationsOf<Small>(5), 3u);
}

TEST_F(TYRecycled_Test, EverySizeHasItsOwnBlocks)
{
    EXPECT_EQ(allocationsOf<Small>(1), 1u);
    EXPECT_EQ(allocationsOf<Larger>(1), 1u);
    EXPECT_EQ(allocationsOf<Small>(1), 0u);
    EXPECT_EQ(allocationsOf<Larger>(1), 0u);
}

TEST_F(TYRecycled_Test, AnObjectThatEndsThroughItsBaseGoesBackUnderItsOwnSize)
{
    std::unique_ptr<Small> object = std::make_unique<Larger>();
    object.reset();
    EXPECT_EQ(allocationsOf<Larger>(1), 0u);
}

TEST_F(TYRecycled_Test, AnObjectOfAnOddSizeLeavesABlockThatHoldsALargerOne)
{
    EXPECT_EQ(allocationsOf<Odd>(1), 1u);
    FailingAllocator::failNth(0);
    std::unique_ptr<Even> const even(new Even);
    FailingAllocator::stop();
    EXPECT_EQ(FailingAllocator::count(), 0u);
    std::memset(even->octets, 1, sizeof even->octets); // the address sanitizer would see it
}

TEST_F(TYRecycled_Test, ObjectsOfALargeAlignmentHaveIt)
{
    for (int i = 0; i < 10; ++i)
    {
        std::unique_ptr<Aligned> const object(new (std::nothrow) Aligned);
        std::unique_ptr<Small> const between(new Small);
        std::unique_ptr<Aligned> const other(new Aligned);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(object.get()) % alignof(Aligned), 0u);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(other.get()) % alignof(Aligned), 0u);
    }
}

TEST_F(TYRecycled_Test, LargeObjectsComeAndGoByThemselves)
{
    EXPECT_EQ(allocationsOf<TooLarge>(1), 1u);
    EXPECT_EQ(allocationsOf<TooLarge>(1), 1u);
}

TEST_F(TYRecycled_Test, WithoutMemoryNothrowNewGivesNull)
{
    FailingAllocator::failNth(1);
    Small* const refused = new (std::nothrow) Small;
    FailingAllocator::failNth(1);
    EXPECT_THROW(std::ignore = new Small, std::bad_alloc);
    FailingAllocator::stop();
    EXPECT_EQ(refused, nullptr);
}

TEST_F(TYRecycled_Test, ABlockThatIsKeptNeedsNoMemory)
{
    delete new Small;
    FailingAllocator::failNth(1);
    std::unique_ptr<Small> const object(new (std::nothrow) Small);
    FailingAllocator::stop();
    EXPECT_NE(object, nullptr);
    EXPECT_FALSE(FailingAllocator::hasFailed());
}

TEST_F(TYRecycled_Test, LoweringTheLimitGivesTheRestBack)
{
    EXPECT_EQ(allocationsOf<Small>(2), 2u);
    TYRecycled::KEEP_BLOCKS(1);
    EXPECT_EQ(allocationsOf<Small>(2), 1u);
    TYRecycled::KEEP_BLOCKS(0);
    EXPECT_EQ(allocationsOf<Small>(2), 2u);
    EXPECT_EQ(allocationsOf<Small>(2), 2u);
}

TEST_F(TYRecycled_Test, AnObjectMayEndOnAnotherThread)
{
    auto object = std::make_unique<Small>();
    std::thread([&object] { object.reset(); }).join(); // and that thread's blocks go back with it
    EXPECT_EQ(allocationsOf<Small>(1), 1u);
}

TEST_F(TYRecycled_Test, AnObjectMayEndAfterItsThreadsBlocks)
{
    std::thread(
        []
        {
            static thread_local std::unique_ptr<Small> late; // made first, so it ends last
            late = std::make_unique<Small>();
            delete new Small;
        })
        .join();
}
