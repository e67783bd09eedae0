#include "testing/Hook.h"

#include "platform/base/XCode.h"

#include <gtest/gtest.h>
#include <memory>

TEST(Hook, AnEmptyOneAnswersOk)
{
    Hook<XCode(int)> const hook{};
    EXPECT_FALSE(hook);
    EXPECT_EQ(hook(3), XCode::OK);
    Hook<void()> const silent{};
    silent();
}

TEST(Hook, ASetOneAnswersForItself)
{
    Hook<XCode(int&)> hook;
    hook = [](int& value)
    {
        ++value;
        return XCode::REFUSED;
    };
    int value = 1;
    EXPECT_TRUE(hook);
    EXPECT_EQ(hook(value), XCode::REFUSED);
    EXPECT_EQ(value, 2);
}

TEST(Hook, MayReplaceItselfWhileItRuns)
{
    Hook<int()> hook;
    hook = [&hook, text = std::make_shared<int>(1)]
    {
        hook = [] { return 2; };
        return *text; // still ours
    };
    EXPECT_EQ(hook(), 1);
    EXPECT_EQ(hook(), 2);
}

TEST(Hook, MayDestroyItsOwner)
{
    auto owner = std::make_unique<Hook<int()>>();
    *owner = [&owner, text = std::make_shared<int>(7)]
    {
        owner.reset();
        return *text;
    };
    EXPECT_EQ((*owner)(), 7);
    EXPECT_EQ(owner, nullptr);
}
