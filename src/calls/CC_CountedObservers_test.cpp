#include "calls/CC_CountedObservers.h"

#include "testing/FailingAllocator.h"
#include "testing/Hook.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace
{
struct Observer
{
    explicit Observer(char observerName) : name(observerName) {}
    char name;
    Hook<void()> hook;
};

/// `Count`: unsigned as calls and legs count, signed as contexts, providers and endpoints do.
template <class Count>
struct CC_CountedObserversTest : testing::Test
{
    using List = CC_CountedObservers<Observer, Count, 2>;

    /// Walks the list and returns the names told, in order.
    std::string tell()
    {
        std::string told;
        list->forEach(
            [&told](Observer& observer)
            {
                told += observer.name;
                observer.hook();
            });
        return told;
    }
    void add(Observer& observer) { EXPECT_EQ(list->add(&observer), XCode::OK); }

    std::unique_ptr<List> list = std::make_unique<List>();
    Observer a{'a'};
    Observer b{'b'};
    Observer c{'c'};
};
using Counts = testing::Types<unsigned int, int>;
TYPED_TEST_SUITE(CC_CountedObserversTest, Counts);
} // namespace

TYPED_TEST(CC_CountedObserversTest, AnEmptyListTellsNobody) { EXPECT_EQ(this->tell(), ""); }

TYPED_TEST(CC_CountedObserversTest, OneAddedTwiceIsToldOnce)
{
    this->add(this->a);
    this->add(this->a);
    EXPECT_EQ(this->tell(), "a");
    EXPECT_EQ(this->list->getNumberOfEntries(), 1u);
}

TYPED_TEST(CC_CountedObserversTest, RemovalsCountDownToSilenceAndBeyond)
{
    this->add(this->a);
    this->add(this->a);
    this->list->remove(&this->a);
    EXPECT_EQ(this->tell(), "a");
    this->list->remove(&this->a);
    EXPECT_EQ(this->tell(), "");
    this->list->remove(&this->a);
    EXPECT_EQ(this->tell(), "a") << "there is no floor";
    this->add(this->a);
    EXPECT_EQ(this->tell(), "");
}

TYPED_TEST(CC_CountedObserversTest, AddRemoveRemoveAddIsSilent)
{
    this->add(this->a);
    this->list->remove(&this->a);
    this->list->remove(&this->a);
    this->add(this->a);
    EXPECT_EQ(this->tell(), "");
}

TYPED_TEST(CC_CountedObserversTest, RemovingOneThatWasNeverAddedDoesNothing)
{
    this->list->remove(&this->a);
    EXPECT_EQ(this->list->getNumberOfEntries(), 0u);
    this->add(this->a);
    EXPECT_EQ(this->tell(), "a");
}

TYPED_TEST(CC_CountedObserversTest, OneThatComesBackKeepsItsFirstPlace)
{
    this->add(this->a);
    this->add(this->b);
    this->list->remove(&this->a);
    this->add(this->a);
    EXPECT_EQ(this->tell(), "ab");
    EXPECT_EQ(this->list->getNumberOfEntries(), 2u);
}

TYPED_TEST(CC_CountedObserversTest, ANewObserverAtAnOldAddressTakesTheOldPlace)
{
    this->add(this->a);
    this->add(this->b);
    this->list->remove(&this->a);
    this->a.name = 'n'; // another observer, in the memory of the first
    this->add(this->a);
    EXPECT_EQ(this->tell(), "nb");
}

TYPED_TEST(CC_CountedObserversTest, OneThatRemovesTheNextKeepsItFromBeingTold)
{
    this->add(this->a);
    this->add(this->b);
    this->add(this->c);
    this->a.hook = [this] { this->list->remove(&this->b); };
    EXPECT_EQ(this->tell(), "ac");
}

TYPED_TEST(CC_CountedObserversTest, OneThatRemovesItselfIsNotTheEndOfTheWalk)
{
    this->add(this->a);
    this->add(this->b);
    this->a.hook = [this] { this->list->remove(&this->a); };
    EXPECT_EQ(this->tell(), "ab");
    EXPECT_EQ(this->tell(), "b");
}

TYPED_TEST(CC_CountedObserversTest, OneAddedDuringADeliveryIsTold)
{
    this->add(this->a);
    this->a.hook = [this]
    {
        this->add(this->b);
        this->add(this->c); // past the inline entries: the list moves while it is walked
        this->a.hook = [] {};
    };
    EXPECT_EQ(this->tell(), "abc");
}

TYPED_TEST(CC_CountedObserversTest, OneRevivedAheadOfTheWalkIsToldAndBehindItIsNot)
{
    this->add(this->a);
    this->add(this->b);
    this->add(this->c);
    this->list->remove(&this->a);
    this->list->remove(&this->c);
    this->b.hook = [this]
    {
        this->add(this->a);
        this->add(this->c);
    };
    EXPECT_EQ(this->tell(), "bc");
}

TYPED_TEST(CC_CountedObserversTest, AWalkWhoseListEndsGoesNoFurther)
{
    this->add(this->a);
    this->add(this->b);
    this->add(this->c);
    this->b.hook = [this] { this->list.reset(); };
    std::string told;
    this->list->forEachWhile([this] { return this->list != nullptr; },
                             [&told](Observer& observer)
                             {
                                 told += observer.name;
                                 observer.hook();
                             });
    EXPECT_EQ(told, "ab");
}

TYPED_TEST(CC_CountedObserversTest, ASilencedListTellsNobodyMore)
{
    this->add(this->a);
    this->add(this->a);
    this->add(this->b);
    this->a.hook = [this] { this->list->silence(); };
    EXPECT_EQ(this->tell(), "a");
    EXPECT_EQ(this->tell(), "");
    EXPECT_EQ(this->list->getNumberOfEntries(), 2u);
}

TYPED_TEST(CC_CountedObserversTest, TheFirstEntriesNeedNoMemoryAndTheNextIsRefused)
{
    FailingAllocator::failNth(1);
    XCode const first = this->list->add(&this->a);
    XCode const second = this->list->add(&this->b);
    unsigned long const allocations = FailingAllocator::count();
    XCode const third = this->list->add(&this->c);
    XCode const known = this->list->add(&this->a);
    FailingAllocator::stop();
    EXPECT_EQ(allocations, 0u);
    EXPECT_EQ(first, XCode::OK);
    EXPECT_EQ(second, XCode::OK);
    EXPECT_EQ(third, XCode::NO_ELEMENT);
    EXPECT_EQ(known, XCode::OK);
    EXPECT_EQ(this->tell(), "ab");
}
