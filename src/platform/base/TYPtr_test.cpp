#include "platform/base/TYPtr.h"

#include "platform/base/TYCounted.h"

#include <atomic>
#include <functional>
#include <gtest/gtest.h>
#include <thread>
#include <utility>

namespace
{
class Object : public TYCounted
{
public:
    Object() { ++s_alive; }
    std::function<void()> m_onEnd = [] {};
    static inline std::atomic<int> s_alive{0};

protected:
    ~Object() override
    {
        m_onEnd();
        --s_alive;
    }
};
using Pointer = TYPtr<Object>;

class TYPtrTest : public testing::Test
{
protected:
    void TearDown() override { EXPECT_EQ(0, Object::s_alive); }
};
using TYPPtrTest = TYPtrTest;
} // namespace

TEST_F(TYPtrTest, ADefaultPointerHoldsNothing)
{
    Pointer const pointer;
    EXPECT_FALSE(pointer);
    EXPECT_EQ(nullptr, pointer.get());
    EXPECT_EQ(pointer, Pointer(nullptr));
}

TEST_F(TYPtrTest, TheLastPointerTakesTheObjectAlong)
{
    Pointer first(new Object);
    {
        Pointer const second = first;
        EXPECT_EQ(first, second);
        first.set(nullptr);
        EXPECT_EQ(1, Object::s_alive);
    }
    EXPECT_EQ(0, Object::s_alive);
}

TEST_F(TYPtrTest, SettingTheObjectHeldChangesNothing)
{
    Pointer pointer(new Object);
    pointer.set(pointer.get());
    EXPECT_EQ(1, Object::s_alive);
    Pointer& self = pointer;
    pointer = self;
    EXPECT_EQ(1, Object::s_alive);
    pointer = std::move(self);
    EXPECT_TRUE(pointer);
    EXPECT_EQ(1, Object::s_alive);
}

TEST_F(TYPtrTest, AssigningGivesUpTheObjectHeldBefore)
{
    Pointer first(new Object);
    Pointer const second(new Object);
    first = second;
    EXPECT_EQ(1, Object::s_alive);
    EXPECT_EQ(second.get(), &*first);
    first = Pointer(new Object);
    EXPECT_EQ(2, Object::s_alive);
    EXPECT_FALSE(first == second);
}

TEST_F(TYPtrTest, MovingLeavesTheSourceEmpty)
{
    Pointer first(new Object);
    Object* const object = first.get();
    Pointer second(std::move(first));
    EXPECT_EQ(object, second.get());
    EXPECT_FALSE(first); // NOLINT(bugprone-use-after-move): what is left is stated
    Pointer third;
    third = std::move(second);
    EXPECT_EQ(object, third.get());
    EXPECT_FALSE(second); // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(1, Object::s_alive);
}

TEST_F(TYPtrTest, AnObjectThatEndsNeverFindsItselfInThePointer)
{
    Pointer pointer(new Object);
    Object* seen = pointer.get();
    pointer->m_onEnd = [&] { seen = pointer.get(); };
    pointer.set(nullptr);
    EXPECT_EQ(nullptr, seen);

    pointer.set(new Object);
    pointer->m_onEnd = [&] { seen = pointer.get(); };
    Pointer const replacement(new Object);
    pointer = replacement;
    EXPECT_EQ(replacement.get(), seen);

    pointer.set(new Object);
    pointer->m_onEnd = [&] { seen = pointer.get(); };
    pointer = Pointer();
    EXPECT_EQ(nullptr, seen);
}

TEST_F(TYPPtrTest, AnEmptyHolderLocksToNull)
{
    TYPPtr<Object> holder;
    EXPECT_TRUE(holder.isEmpty());
    TYLockPtr<Object> locked(holder);
    EXPECT_EQ(nullptr, locked.lock());
    locked.unlock();
    locked.unlock(); // not held: nothing happens
}

TEST_F(TYPPtrTest, TheObjectIsReachedUnderTheLock)
{
    TYPPtr<Object> holder;
    holder.set(new Object);
    EXPECT_FALSE(holder.isEmpty());
    TYLockPtr<Object> locked(holder);
    EXPECT_EQ(locked.lock(), locked.lock()); // locked once, so one unlock suffices
    locked.unlock();
    std::thread([&] { holder.set(nullptr); }).join();
    EXPECT_TRUE(holder.isEmpty());
}

TEST_F(TYPPtrTest, ALockEndsWithItsScope)
{
    TYPPtr<Object> holder;
    {
        TYLockPtr<Object> locked(holder);
        EXPECT_EQ(nullptr, locked.lock());
    }
    std::thread([&] { holder.set(new Object); }).join();
    EXPECT_FALSE(holder.isEmpty());
}

TEST_F(TYPPtrTest, ACopyHoldsTheObjectAndHasALockOfItsOwn)
{
    TYPPtr<Object> original;
    original.set(new Object);
    TYPPtr<Object> copy(original);
    original.set(nullptr);
    EXPECT_EQ(1, Object::s_alive);
    TYLockPtr<Object> lockedOriginal(original);
    TYLockPtr<Object> lockedCopy(copy);
    EXPECT_EQ(nullptr, lockedOriginal.lock());
    std::thread([&] { EXPECT_FALSE(copy.isEmpty()); }).join();
    EXPECT_NE(nullptr, lockedCopy.lock());
}

TEST_F(TYPPtrTest, AReplacedObjectEndsOutsideTheLock)
{
    TYPPtr<Object> holder;
    Object* const object = new Object;
    bool wasEmpty = false;
    // another thread gets through while the object ends
    object->m_onEnd = [&] { std::thread([&] { wasEmpty = holder.isEmpty(); }).join(); };
    holder.set(object);
    holder.set(nullptr);
    EXPECT_TRUE(wasEmpty);
}

TEST_F(TYPPtrTest, ThreadsMayReplaceAndUseTheObjectAtOnce)
{
    TYPPtr<Object> holder;
    std::thread replacing(
        [&]
        {
            for (unsigned int i = 0; i < 1000; ++i)
                holder.set(i % 2 == 0 ? new Object : nullptr);
        });
    unsigned int found = 0;
    for (unsigned int i = 0; i < 1000; ++i)
    {
        TYLockPtr<Object> locked(holder);
        if (Object* const object = locked.lock())
            found += object->m_onEnd != nullptr ? 1 : 0;
        TYPPtr<Object> const copy(holder);
    }
    replacing.join();
    EXPECT_LE(found, 1000U);
    EXPECT_TRUE(holder.isEmpty());
}
