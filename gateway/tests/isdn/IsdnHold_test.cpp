// HOLD and RETRIEVE (EN 300 141-1): what NOTIFY alone tells is among the properties.
#include "IsdnFixture.h"

namespace
{
struct IsdnHoldTest : IsdnFixture
{
    void callUp()
    {
        side->call("4989123");
        ASSERT_TRUE(watch.runUntil([&] { return other.getCall() != nullptr; }));
        std::ignore = other.become(FakeModule::State::CONNECTED);
        ASSERT_TRUE(waitFor("ANSWER"));
    }
    void hold()
    {
        side->hold(side->getCall());
        ASSERT_TRUE(waitFor("HOLD_ACK"));
        ASSERT_TRUE(waitForPeer("HELD"));
    }
    unsigned int getNumberOfTaken()
    {
        return static_cast<unsigned int>(configuration.channels.count()) - interface->getChannels().getNumberOfFree();
    }
};
} // namespace

TEST_F(IsdnHoldTest, ACallOnHoldHasNoChannelAndIsTakenBackOnAnotherOne)
{
    open();
    callUp();
    EXPECT_FALSE(interface->getChannels().isFree(20));
    hold();
    EXPECT_EQ(getNumberOfTaken(), 0u);
    side->retrieve(side->getCall(), 5);
    ASSERT_TRUE(waitFor("RETRIEVE_ACK"));
    EXPECT_TRUE(waitForPeer("CONNECTED"));
    EXPECT_FALSE(interface->getChannels().isFree(5));
    EXPECT_EQ(getNumberOfTaken(), 1u);
    side->clear(16);
    EXPECT_TRUE(waitForPeer("RELEASED"));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnHoldTest, ACallOnHoldIsClearedByEitherSide)
{
    open();
    for (bool const isByWire : {true, false})
    {
        callUp();
        hold();
        isByWire ? side->clear(31) : other.hangUp();
        if (isByWire)
            EXPECT_TRUE(waitForPeer("RELEASED"));
        else
            EXPECT_TRUE(waitFor("HANGUP_REQ 16"));
        other.hangUp();
        side->take();
        expectNothingLeft();
    }
}

TEST_F(IsdnHoldTest, WhereNoChannelIsLeftTheCallStaysOnHold)
{
    configuration.channels.reset().set(20);
    open();
    callUp();
    q931_call* const first = side->getCall();
    hold();
    FakeModule second("second");
    routes.front().to = "second";
    side->call("4989123");
    ASSERT_TRUE(watch.runUntil([&] { return second.getCall() != nullptr; }));
    side->retrieve(first, 20);
    ASSERT_TRUE(waitFor("RETRIEVE_REJ"));
    EXPECT_EQ(other.getPeerState(), "HELD");
    second.hangUp();
    ASSERT_TRUE(watch.runUntil([&] { return getNumberOfTaken() == 0; }));
    side->retrieve(first, 20);
    ASSERT_TRUE(waitFor("RETRIEVE_ACK"));
    EXPECT_TRUE(waitForPeer("CONNECTED"));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnHoldTest, TheTwoOthersAreConnectedWhenTheFarSideTransfersItsCalls)
{
    open();
    side->ask([](pri* stack) { return pri_transfer_enable(stack, 1), 0; });
    callUp();
    q931_call* const first = side->getCall();
    hold();
    FakeModule second("second");
    routes.front().to = "second";
    side->take();
    side->call("4989124");
    ASSERT_TRUE(watch.runUntil([&] { return second.getCall() != nullptr; }));
    std::ignore = second.become(FakeModule::State::CONNECTED);
    ASSERT_TRUE(waitFor("ANSWER"));
    q931_call* const other2 = side->getCall();
    EXPECT_EQ(side->ask([&](pri*) { return pri_channel_bridge(first, other2); }), 0);
    EXPECT_TRUE(watch.runUntil([&] { return other.getCall() == second.getCall(); }, std::chrono::seconds(3)));
    EXPECT_EQ(other.getPeerState(), "CONNECTED");
    EXPECT_EQ(second.getPeerState(), "CONNECTED");
    expectNothingLeft();
    EXPECT_EQ(std::count(side->told.begin(), side->told.end(), "HANGUP_REQ 16"), 2);
    other.hangUp();
    second.hangUp();
}

TEST_F(IsdnHoldTest, ACallThatIsNotUpIsNotHeld)
{
    open();
    side->call("4989123");
    ASSERT_TRUE(watch.runUntil([&] { return other.getCall() != nullptr; }));
    std::ignore = other.become(FakeModule::State::ALERTING);
    ASSERT_TRUE(waitFor("RINGING"));
    side->hold(side->getCall());
    settle();
    EXPECT_FALSE(side->has("HOLD_ACK"));
    EXPECT_NE(other.getPeerState(), "HELD");
    EXPECT_EQ(getNumberOfTaken(), 1u);
    other.hangUp();
    expectNothingLeft();
}
