#include "properties/CC_Flags.h"

#include "properties/CC_PropertyId.h"
#include "testing/FailingAllocator.h"

#include <csignal>
#include <gtest/gtest.h>
#include <sys/time.h>
#include <tuple>
#include <unistd.h>
#include <utility>
#include <vector>

namespace
{
CC_Flags FLAGS_OF(std::vector<unsigned int> const& bits)
{
    CC_Flags flags;
    for (unsigned int const bit : bits)
        EXPECT_TRUE(flags.set(bit, true).isOk());
    return flags;
}

std::vector<unsigned int> BITS_OF(CC_Flags const& flags)
{
    std::vector<unsigned int> bits;
    for (unsigned int bit = flags.getFirstSet(0); bit != CC_Flags::NONE; bit = flags.getFirstSet(bit + 1))
        bits.push_back(bit);
    return bits;
}

/// Sends SIGALRM to this process after 50 milliseconds, and again and again.
void START_ALARMS()
{
    itimerval const interval = {{0, 50000}, {0, 50000}};
    setitimer(ITIMER_REAL, &interval, nullptr);
}

CC_Flags* s_waitedFor = nullptr;
void SET_THEN_GIVE_UP(int)
{
    static int alarms = 0;
    if (++alarms == 1)
        std::ignore = s_waitedFor->set(CC_PropertyId::STATE, true); // its word is there
    else if (alarms == 20)
        _exit(2);
}
} // namespace

TEST(CC_Flags, AFreshSetIsEmptyAndHasNoMemory)
{
    CC_Flags const flags;
    EXPECT_TRUE(flags.isEmpty());
    EXPECT_EQ(0U, flags.getCapacity());
    EXPECT_EQ(0U, flags.getCount());
    EXPECT_FALSE(flags.get(0));
    EXPECT_EQ(CC_Flags::NONE, flags.getFirstSet(0));
    EXPECT_EQ(0xffffffffU, CC_Flags::NONE);
}

TEST(CC_Flags, SettingAnIdStoresTheWordThatHoldsIt)
{
    CC_Flags flags;
    ASSERT_TRUE(flags.set(0x40020c, true).isOk());
    ASSERT_EQ(1U, flags.getCount());
    EXPECT_EQ(0x20010U, flags.getEntry(0).wordIndex);
    EXPECT_EQ(0x1000U, flags.getEntry(0).bits);
    EXPECT_EQ(0x40020cU, flags.getFirstSet(0));
    EXPECT_TRUE(flags.get(0x40020c));
    EXPECT_FALSE(flags.get(0x40020d));
    EXPECT_FALSE(flags.isEmpty());
}

TEST(CC_Flags, WordsStaySortedWhateverTheOrderOfSetting)
{
    CC_Flags const flags = FLAGS_OF({0x400100, 0x400000, 0x401003, 0x400080});
    ASSERT_EQ(4U, flags.getCount());
    EXPECT_EQ(0x20000U, flags.getEntry(0).wordIndex);
    EXPECT_EQ(0x20004U, flags.getEntry(1).wordIndex);
    EXPECT_EQ(0x20008U, flags.getEntry(2).wordIndex);
    EXPECT_EQ(0x20080U, flags.getEntry(3).wordIndex);
    EXPECT_EQ((std::vector<unsigned int>{0x400000, 0x400080, 0x400100, 0x401003}), BITS_OF(flags));
}

TEST(CC_Flags, ClearingABitWithoutAWordStoresNothing)
{
    CC_Flags flags;
    EXPECT_TRUE(flags.set(0x40020c, false).isOk());
    EXPECT_EQ(0U, flags.getCount());
    EXPECT_EQ(0U, flags.getCapacity());
}

TEST(CC_Flags, AWordWithoutBitsStaysInPlace)
{
    CC_Flags flags = FLAGS_OF({0x400100, 0x400200});
    EXPECT_TRUE(flags.set(0x400100, false).isOk());
    EXPECT_EQ(2U, flags.getCount());
    EXPECT_EQ(0U, flags.getEntry(0).bits);
    EXPECT_FALSE(flags.get(0x400100));
    EXPECT_EQ(0x400200U, flags.getFirstSet(0));
}

TEST(CC_Flags, GrowsByExactlyOneWord)
{
    CC_Flags flags;
    for (unsigned int words = 1; words <= 3; ++words)
    {
        ASSERT_TRUE(flags.set(words * 32, true).isOk());
        EXPECT_EQ(words, flags.getCapacity());
        EXPECT_EQ(words, flags.getCount());
    }
    ASSERT_TRUE(flags.set(33, true).isOk()); // in a word that is there
    EXPECT_EQ(3U, flags.getCapacity());
}

TEST(CC_Flags, TheFirstSetBitIsNotBelowTheStart)
{
    CC_Flags const flags = FLAGS_OF({3, 5, 31, 64, 0x400200});
    struct Case
    {
        unsigned int from;
        unsigned int expected;
    };
    for (Case const& row : {Case{0, 3}, Case{3, 3}, Case{4, 5}, Case{6, 31}, Case{31, 31}, Case{32, 64}, Case{64, 64},
                            Case{65, 0x400200}, Case{0x400200, 0x400200}, Case{0x400201, CC_Flags::NONE},
                            Case{0x400220, CC_Flags::NONE}, Case{0xffffffff, CC_Flags::NONE}})
        EXPECT_EQ(row.expected, flags.getFirstSet(row.from)) << row.from;
}

TEST(CC_Flags, TheSearchDoesNotBeginAgainPastTheLastNumber)
{
    CC_Flags flags = FLAGS_OF({0, 0xfffffffe});
    EXPECT_EQ(0xfffffffeU, flags.getFirstSet(1));
    EXPECT_EQ(CC_Flags::NONE, flags.getFirstSet(0xffffffff));
    ASSERT_TRUE(flags.set(0xffffffff, true).isOk());
    EXPECT_TRUE(flags.get(0xffffffff));
    EXPECT_EQ(0xffffffffU, flags.getFirstSet(0xffffffff));
}

TEST(CC_Flags, AClearedSetKeepsItsCapacity)
{
    CC_Flags flags = FLAGS_OF({0x400100, 0x400200});
    flags.clear();
    EXPECT_TRUE(flags.isEmpty());
    EXPECT_FALSE(flags.get(0x400100));
    EXPECT_EQ(2U, flags.getCapacity());
    ASSERT_TRUE(flags.set(0x400300, true).isOk());
    EXPECT_EQ((std::vector<unsigned int>{0x400300}), BITS_OF(flags));
    EXPECT_EQ(2U, flags.getCapacity());
}

TEST(CC_Flags, ACopyMakesRoomForExactlyTheOthersWords)
{
    CC_Flags const five = FLAGS_OF({0, 32, 64, 96, 128});
    CC_Flags two = FLAGS_OF({7, 40});
    ASSERT_EQ(2U, two.getCapacity());
    two = five;
    EXPECT_EQ(5U, two.getCapacity());
    EXPECT_EQ(5U, two.getCount());
    EXPECT_EQ(BITS_OF(five), BITS_OF(two));

    CC_Flags const copy(five);
    EXPECT_EQ(5U, copy.getCapacity());
    EXPECT_EQ(BITS_OF(five), BITS_OF(copy));
}

TEST(CC_Flags, ACopyNeverShrinksTheCapacity)
{
    CC_Flags flags = FLAGS_OF({0, 32, 64});
    flags = FLAGS_OF({5});
    EXPECT_EQ(3U, flags.getCapacity());
    EXPECT_EQ((std::vector<unsigned int>{5}), BITS_OF(flags));
    flags = CC_Flags();
    EXPECT_EQ(3U, flags.getCapacity());
    EXPECT_TRUE(flags.isEmpty());
}

TEST(CC_Flags, MovingASetTakesItsMemoryAndLeavesItEmpty)
{
    for (std::vector<unsigned int> const& bits : {std::vector<unsigned int>{5, 64}, {5, 64, 128}})
    {
        CC_Flags flags = FLAGS_OF(bits);
        FailingAllocator::failNth(1);
        CC_Flags const taken(std::move(flags));
        FailingAllocator::stop();
        EXPECT_FALSE(FailingAllocator::hasFailed());
        EXPECT_EQ(bits, BITS_OF(taken));
        EXPECT_EQ(bits.size(), taken.getCapacity());
        EXPECT_TRUE(flags.isEmpty());
        EXPECT_EQ(0U, flags.getCapacity());
        ASSERT_TRUE(flags.set(7, true).isOk());
        EXPECT_EQ((std::vector<unsigned int>{7}), BITS_OF(flags));
        EXPECT_EQ(bits, BITS_OF(taken));
    }
}

TEST(CC_Flags, TheFirstTwoWordsNeedNoMemory)
{
    CC_Flags flags;
    FailingAllocator::failNth(1);
    XCode const first = flags.set(5, true);
    XCode const second = flags.set(64, true);
    CC_Flags const copy(flags);
    FailingAllocator::stop();
    EXPECT_FALSE(FailingAllocator::hasFailed());
    EXPECT_EQ(XCode::OK, first);
    EXPECT_EQ(XCode::OK, second);
    EXPECT_EQ((std::vector<unsigned int>{5, 64}), BITS_OF(copy));
}

TEST(CC_Flags, BackToTwoWordsItLetsGoOfItsMemory)
{
    CC_Flags flags = FLAGS_OF({5, 64});
    ASSERT_EQ(XCode::OK, flags.enlarge(10));
    EXPECT_EQ(XCode::OK, flags.enlarge(2));
    EXPECT_EQ(2U, flags.getCapacity());
    EXPECT_EQ((std::vector<unsigned int>{5, 64}), BITS_OF(flags));
}

TEST(CC_Flags, AssigningASetToItselfChangesNothing)
{
    CC_Flags flags = FLAGS_OF({5, 64});
    CC_Flags const& same = flags;
    flags = same;
    EXPECT_EQ((std::vector<unsigned int>{5, 64}), BITS_OF(flags));
}

TEST(CC_Flags, EnlargingIsRefusedBelowTheWordsInUse)
{
    CC_Flags flags = FLAGS_OF({0, 32, 64});
    EXPECT_EQ(XCode::REFUSED, flags.enlarge(2));
    EXPECT_EQ(3U, flags.getCapacity());
    EXPECT_EQ((std::vector<unsigned int>{0, 32, 64}), BITS_OF(flags));
    EXPECT_EQ(XCode::OK, flags.enlarge(10));
    EXPECT_EQ(10U, flags.getCapacity());
    EXPECT_EQ(XCode::OK, flags.enlarge(3)); // exactly what it is told, also less
    EXPECT_EQ(3U, flags.getCapacity());
    EXPECT_EQ((std::vector<unsigned int>{0, 32, 64}), BITS_OF(flags));
}

TEST(CC_Flags, WithoutMemoryASetStaysAsItWas)
{
    CC_Flags flags = FLAGS_OF({5, 64});
    FailingAllocator::failNth(1);
    XCode const set = flags.set(128, true);
    FailingAllocator::failNth(1);
    XCode const enlarged = flags.enlarge(8);
    FailingAllocator::stop();
    EXPECT_EQ(XCode::NO_ELEMENT, set);
    EXPECT_EQ(XCode::NO_ELEMENT, enlarged);
    EXPECT_EQ(2U, flags.getCapacity());
    EXPECT_EQ((std::vector<unsigned int>{5, 64}), BITS_OF(flags));
}

TEST(CC_Flags, WithoutMemoryACopyIsCutOffSilently)
{
    CC_Flags const five = FLAGS_OF({0, 32, 64, 96, 128});
    CC_Flags two = FLAGS_OF({7, 40});
    FailingAllocator::failNth(1);
    two = five;
    FailingAllocator::stop();
    EXPECT_EQ(2U, two.getCapacity());
    EXPECT_EQ((std::vector<unsigned int>{0, 32}), BITS_OF(two));

    FailingAllocator::failNth(1);
    CC_Flags const copy(five);
    FailingAllocator::stop();
    EXPECT_TRUE(copy.isEmpty());
}

// intended: sets are emptied by clear(), and the first word of one that is in use always has a bit
TEST(CC_Flags, AskingASetWhoseFirstWordWasTakenBackWaits)
{
    CC_Flags flags = FLAGS_OF({CC_PropertyId::STATE});
    ASSERT_TRUE(flags.set(CC_PropertyId::STATE, false).isOk());
    EXPECT_EXIT(
        {
            std::signal(SIGALRM, SIG_DFL);
            START_ALARMS();
            _exit(flags.isEmpty() ? 0 : 1);
        },
        testing::KilledBySignal(SIGALRM), "");
}

TEST(CC_Flags, TheWaitEndsWhenTheWordGetsABit)
{
    CC_Flags flags = FLAGS_OF({CC_PropertyId::STATE});
    ASSERT_TRUE(flags.set(CC_PropertyId::STATE, false).isOk());
    EXPECT_EXIT(
        {
            s_waitedFor = &flags;
            std::signal(SIGALRM, SET_THEN_GIVE_UP);
            START_ALARMS();
            _exit(flags.isEmpty() ? 1 : 0);
        },
        testing::ExitedWithCode(0), "");
}

TEST(CC_Flags, OnlyTheFirstWordDecidesWhetherASetIsEmpty)
{
    CC_Flags flags = FLAGS_OF({0x400100, 0x400200});
    ASSERT_TRUE(flags.set(0x400200, false).isOk());
    EXPECT_FALSE(flags.isEmpty());
}
