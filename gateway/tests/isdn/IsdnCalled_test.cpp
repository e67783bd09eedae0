#include "IsdnFixture.h"

namespace
{
struct IsdnCalledTest : IsdnFixture
{
    /// The other side calls the line.
    void call(char const* number, bool isComplete = true)
    {
        CC_PropertyContainer own;
        std::ignore = own.set(Key::E164_NUMBER, "4930123456");
        std::ignore = own.set(Key::TYPE_OF_NUMBER, QTypeOfNumber::INTERNATIONAL);
        std::ignore = own.set(Key::SUPPORTS_OVERLAP_SENDING, !isComplete);
        EXPECT_TRUE(other.dial(NAME, number, own, CC_PropertyContainer::EMPTY(), CC_PropertyContainer::EMPTY()).isOk());
    }
};
} // namespace

TEST_F(IsdnCalledTest, ACallRingsIsAnsweredAndCleared)
{
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    side->proceed();
    EXPECT_TRUE(waitForPeer("PROCEEDING"));
    side->ring();
    EXPECT_TRUE(waitForPeer("ALERTING"));
    side->answer();
    EXPECT_TRUE(waitForPeer("CONNECTED"));
    other.hangUp(QCause::NORMAL_CALL_CLEARING);
    EXPECT_TRUE(waitFor("HANGUP_REQ 16"));
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, TheFarSideClears)
{
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    side->answer();
    EXPECT_TRUE(waitForPeer("CONNECTED"));
    side->clear(31);
    EXPECT_TRUE(waitForPeer("RELEASED"));
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), "Normal, unspecified");
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, BothSidesClearAtOnce)
{
    open();
    for (bool const isCrossing : {false, true})
    {
        call("4989123");
        ASSERT_TRUE(waitFor("RING 4989123."));
        side->answer();
        ASSERT_TRUE(waitForPeer("CONNECTED"));
        if (!isCrossing)
            side->clear(31);
        other.hangUp();
        loop.runTurn(); // ours is on its way
        if (isCrossing)
            side->clear(31);
        expectNothingLeft();
        side->take();
    }
}

TEST_F(IsdnCalledTest, ARefusalBearsItsCause)
{
    open();
    for (int cause = 1; cause <= 127; ++cause)
    {
        call("4989123");
        ASSERT_TRUE(waitFor("RING 4989123."));
        side->take();
        side->proceed();
        side->clear(cause);
        ASSERT_TRUE(waitForPeer("RELEASED")) << cause;
        auto const* const told = dynamic_cast<CC_PropertyCause const*>(other.m_adapter->getPeerCauseProperty());
        ASSERT_NE(told, nullptr) << cause;
        EXPECT_EQ(static_cast<int>(told->getCause()), cause);
        other.hangUp();
        expectNothingLeft();
    }
}

TEST_F(IsdnCalledTest, ACallIsGivenUpInEachState)
{
    open();
    for (unsigned int state = 1; state < 5; ++state)
    {
        call("4989123", state != 1);
        ASSERT_TRUE(waitFor(state != 1 ? "RING 4989123." : "RING 4989123"));
        side->take();
        if (state == 1)
            side->requestDigits();
        if (state == 2)
            side->proceed();
        if (state == 3)
            side->ring();
        if (state == 4)
            side->answer();
        settle();
        other.hangUp(QCause::NORMAL_CALL_CLEARING);
        EXPECT_TRUE(watch.runUntil([&] { return side->has("HANGUP_REQ 16") || side->has("HANGUP 16"); })) << state;
        side->take();
        expectNothingLeft();
    }
}

TEST_F(IsdnCalledTest, DigitsFollowOneByOne)
{
    open();
    call("49", false);
    ASSERT_TRUE(waitFor("RING 49"));
    other.key("8");
    side->requestDigits();
    EXPECT_TRUE(waitFor("INFO_RECEIVED 8"));
    EXPECT_TRUE(waitForPeer("ADDRESS-INCOMPLETE"));
    other.key("91");
    EXPECT_TRUE(waitFor("INFO_RECEIVED 1"));
    EXPECT_EQ(side->take(), (IsdnFarSide::Lines{"RING 49", "INFO_RECEIVED 8", "INFO_RECEIVED 9", "INFO_RECEIVED 1"}));
    side->ring();
    EXPECT_TRUE(waitForPeer("ALERTING"));
    other.key("5");
    settle();
    EXPECT_EQ(side->take(), IsdnFarSide::Lines()) << "the number is complete";
}

TEST_F(IsdnCalledTest, ALineThatTakesNumbersWholeWaitsForThem)
{
    configuration.isOverlapSending = false;
    configuration.timers.t302 = 100;
    open();
    call("49", false);
    EXPECT_TRUE(waitForPeer("ADDRESS-INCOMPLETE"));
    other.key("8");
    other.key("9");
    EXPECT_TRUE(waitFor("RING 4989."));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, ANumberThatIsSaidToBeWholeIsNotWaitedFor)
{
    configuration.isOverlapSending = false;
    open();
    call("4989", false);
    EXPECT_TRUE(waitForPeer("ADDRESS-INCOMPLETE"));
    std::ignore = other.say(CC_PropertyBoolean(CC_PropertyId::SUPPORTS_OVERLAP_SENDING, false));
    EXPECT_TRUE(waitFor("RING 4989."));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, ANumberThatLeadsNowhereIsGivenUp)
{
    configuration.timers.t304 = 50;
    open();
    call("49", false);
    ASSERT_TRUE(waitFor("RING 49"));
    side->requestDigits();
    EXPECT_TRUE(waitFor("HANGUP_REQ 102"));
    EXPECT_TRUE(waitForPeer("RELEASED"));
}

TEST_F(IsdnCalledTest, NobodyAnswers)
{
    configuration.timers.answer = 80;
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    side->ring();
    EXPECT_TRUE(waitFor("HANGUP_REQ 19"));
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, NoChannelIsFree)
{
    configuration.channels = 1 << 5;
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    FakeModule third("third");
    EXPECT_TRUE(third.dial(NAME, "4989", {}, {}, {}).isOk());
    settle();
    EXPECT_EQ(third.getPeerState(), "RELEASED");
    EXPECT_EQ(third.getPeerValue(CC_PropertyId::CAUSE), "No circuit/channel available");
}

TEST_F(IsdnCalledTest, ALinkThatIsDownTakesNoCalls)
{
    configuration.timers.t203 = 100;
    open();
    side.reset();
    ASSERT_TRUE(watch.runUntil([&] { return !interface->getLink().isUp(); }));
    call("4989123");
    settle();
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), "Network out of order");
}

TEST_F(IsdnCalledTest, ACallOutlastsALinkForT309)
{
    configuration.timers.t203 = 100;
    configuration.timers.t309 = 200;
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    side->answer();
    ASSERT_TRUE(waitForPeer("CONNECTED"));
    side.reset();
    ASSERT_TRUE(watch.runUntil([&] { return !interface->getLink().isUp(); }));
    EXPECT_EQ(other.getPeerState(), "CONNECTED");
    EXPECT_TRUE(waitForPeer("RELEASED"));
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), "Destination out of order");
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, TheFarSideTakesAnotherChannel)
{
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    EXPECT_EQ(side->getChannel(), 1) << "the user's side begins at the bottom";
    side->useChannel(9);
    side->proceed();
    EXPECT_TRUE(waitForPeer("PROCEEDING"));
    EXPECT_TRUE(interface->getChannels().isFree(1));
    EXPECT_FALSE(interface->getChannels().isFree(9));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnCalledTest, ACallOfTheNetworkWinsTheChannel)
{
    open();
    call("4989123"); // on channel 1, still on its way
    FakeModule third("third");
    routes.front().to = "third";
    side->call("4930", true, 1, true);
    EXPECT_TRUE(watch.runUntil([&] { return third.getCall() != nullptr; }));
    settle();
    EXPECT_FALSE(interface->getChannels().isFree(1));
    EXPECT_EQ(interface->getNumberOfEndpoints(), 2u);
}

TEST_F(IsdnCalledTest, DigitsAreKeyedInBothWays)
{
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    side->answer();
    ASSERT_TRUE(waitForPeer("CONNECTED"));
    other.key("1x2#");
    EXPECT_TRUE(waitFor("KEYPAD_DIGIT 12#"));
    other.take();
    side->key("7");
    settle();
    EXPECT_NE(testing::PrintToString(other.take()).find("7"), std::string::npos);
}

TEST_F(IsdnCalledTest, HoldIsTold)
{
    open();
    call("4989123");
    ASSERT_TRUE(waitFor("RING 4989123."));
    side->answer();
    ASSERT_TRUE(waitForPeer("CONNECTED"));
    std::ignore = other.become(FakeModule::State::HELD);
    EXPECT_TRUE(waitFor("NOTIFY 121"));
    std::ignore = other.become(FakeModule::State::CONNECTED);
    EXPECT_TRUE(waitFor("NOTIFY 122"));
    side->notify(PRI_NOTIFY_REMOTE_HOLD);
    EXPECT_TRUE(waitForPeer("HELD"));
    side->notify(PRI_NOTIFY_REMOTE_RETRIEVAL);
    EXPECT_TRUE(waitForPeer("CONNECTED"));
}

TEST_F(IsdnCalledTest, ANameIsNoNumberOfALine)
{
    open();
    call("alice");
    settle();
    EXPECT_EQ(other.getPeerState(), "RELEASED");
    expectNothingLeft();
}
