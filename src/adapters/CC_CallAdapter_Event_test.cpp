#include "properties/CC_PropertyBoolean.h"
#include "testing/FailingAllocator.h"
#include "tests/support/TestLine.h"

namespace
{
using namespace CC_PropertyId;

/// What reaches the module, and when.
class CC_CallAdapter_Event_Test : public TestLines
{
protected:
    CC_CallAdapter_Event_Test() { connect(); }
};
} // namespace

TEST_F(CC_CallAdapter_Event_Test, ThreeChangesAreOneNotificationWithTheIdOnce)
{
    std::size_t const before = a.module.getFlagSets().size();
    b.say(NAME, "x");
    b.say(NAME, "y");
    b.say(NAME, "z");
    EXPECT_EQ(a.module.getFlagSets().size(), before) << "not before the loop's next turn";
    EXPECT_TRUE(turn());
    ASSERT_EQ(a.module.getFlagSets().size(), before + 1);
    EXPECT_EQ(a.module.getFlagSets().back(), std::vector<unsigned int>{NAME});
    EXPECT_EQ(a.peer(NAME), "z") << "the last value";
    EXPECT_FALSE(turn()) << "nothing is left to do";
}

TEST_F(CC_CallAdapter_Event_Test, ManyIdsOfPeerAndCallAreOneNotification)
{
    b.say(NAME, "x");
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(DISPLAY, "y")), XCode::OK);
    b.become(State::HELD);
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Name, Display, State)"});
}

TEST_F(CC_CallAdapter_Event_Test, APropertyThatChangedAndChangedBackIsReported)
{
    b.say(NAME, "x");
    listen();
    b.say(NAME, "y");
    b.say(NAME, "x");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Name)"});
    EXPECT_EQ(a.peer(NAME), "x");
}

TEST_F(CC_CallAdapter_Event_Test, AnEqualValueIsNotReported)
{
    b.say(NAME, "x");
    listen();
    b.say(NAME, "x");
    EXPECT_EQ(heardBy(a), Lines());
}

TEST_F(CC_CallAdapter_Event_Test, ChangesOfTheOwnLegAreNeverReported)
{
    a.say(NAME, "x");
    a.become(State::HELD);
    EXPECT_EQ(a.adapter.setOwnPropertyUnfiltered(CC_PropertyString(DISPLAY, "y")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines());
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Name, Display, State)"}) << "only to the other side";
}

TEST_F(CC_CallAdapter_Event_Test, WhatChangesInsideTheNotificationBelongsToTheNextTurn)
{
    std::size_t const before = a.module.getFlagSets().size();
    a.module.m_onPeerPropertyChange = [this](CC_CallAdapter&, CC_Flags const&)
    {
        a.module.m_onPeerPropertyChange = nullptr;
        b.say(DISPLAY, "y");
    };
    b.say(NAME, "x");
    turn();
    EXPECT_EQ(a.module.getFlagSets().size(), before + 1);
    EXPECT_EQ(a.module.getFlagSets().back(), std::vector<unsigned int>{NAME});
    turn();
    EXPECT_EQ(a.module.getFlagSets().back(), std::vector<unsigned int>{DISPLAY});
}

TEST_F(CC_CallAdapter_Event_Test, ADropTakesAPendingNotificationBack)
{
    b.say(NAME, "x");
    a.drop();
    EXPECT_EQ(heardBy(a), Lines());
}

TEST_F(CC_CallAdapter_Event_Test, TheModuleMayDropInsideTheNotification)
{
    a.module.m_onPeerPropertyChange = [](CC_CallAdapter& adapter, CC_Flags const&)
    { adapter.drop(QCause::UNSPECIFIED, 0); };
    b.say(NAME, "x");
    b.become(State::HELD);
    settle();
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(b.peer(STATE), "RELEASED");
}

TEST_F(CC_CallAdapter_Event_Test, WithoutMemoryForTheMarkTheViewIsUpToDateAllTheSame)
{
    bool wasSilent = false;
    b.say(NAME, "0");
    for (unsigned long n = 1; n < 100; ++n)
    {
        listen();
        b.become(n % 2 == 0 ? State::CONNECTED : State::HELD); // the ids of the first two words need no memory
        b.say(NETWORK, std::to_string(n).c_str());
        String const text = String::stringOf(static_cast<unsigned int>(n));
        FailingAllocator::failNth(n);
        XCode const result = b.adapter.setOwnProperty(CC_PropertyString(NAME, text));
        FailingAllocator::stop();
        Lines const heard = heardBy(a);
        ASSERT_EQ(heard.size(), 1u);
        bool const isHeard = heard[0].find("Name") != std::string::npos;
        EXPECT_EQ(a.peer(NAME), text.c_str());
        if (result.isOk() && !isHeard)
            wasSilent = true;
        if (!FailingAllocator::hasFailed())
        {
            EXPECT_TRUE(isHeard);
            break;
        }
    }
    EXPECT_TRUE(wasSilent) << "a mark that finds no memory is dropped";
}
