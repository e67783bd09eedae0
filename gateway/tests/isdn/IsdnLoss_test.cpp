#include "IsdnFixture.h"

#include <functional>

// The D channel is lost in each state of a call: the other side is told with cause 27, at once or, of a call that is
// up, after T309 (Q.931, 5.8.9); a call that comes meanwhile gets 38, and nothing is left of any of them.

namespace
{
constexpr char const* OUT_OF_ORDER = "Destination out of order";

struct IsdnLossTest;

struct Situation
{
    char const* name;
    bool isCalling; ///< the line's user calls; else he is called
    bool isUp;      ///< then T309 is waited for
    bool hasPeer;   ///< there is somebody to be told
    void (*bringAbout)(IsdnLossTest& test);
};

std::ostream& operator<<(std::ostream& out, Situation const& situation) { return out << situation.name; }

struct IsdnLossTest : IsdnFixture, testing::WithParamInterface<Situation>
{
    IsdnLossTest()
    {
        configuration.timers.t200 = 20;
        configuration.timers.t203 = 30;
        configuration.timers.t309 = 100;
        configuration.collects = false;
    }
    void dial(FakeModule& module, char const* number, bool isComplete = true)
    {
        CC_PropertyContainer own;
        std::ignore = own.set(Key::SUPPORTS_OVERLAP_SENDING, !isComplete);
        auto const& none = CC_PropertyContainer::EMPTY();
        EXPECT_TRUE(module.dial(NAME, number, own, none, none).isOk());
    }
    void bringUpCalled()
    {
        dial(other, "4989123");
        ASSERT_TRUE(waitFor("RING 4989123."));
        side->answer();
        ASSERT_TRUE(waitForPeer("CONNECTED"));
    }
    void bringUpCalling()
    {
        side->call("4989123");
        ASSERT_TRUE(waitForOffer());
        std::ignore = other.become(FakeModule::State::CONNECTED);
        ASSERT_TRUE(waitFor("ANSWER"));
    }
    bool waitForOffer()
    {
        return watch.runUntil([this] { return other.getCall() != nullptr; }, std::chrono::seconds(3));
    }
};

Situation const SITUATIONS[] = {
    {"CalledHasSaidNothing", false, false, true,
     [](IsdnLossTest& test)
     {
         test.dial(test.other, "4989123");
         ASSERT_TRUE(test.waitFor("RING 4989123."));
     }},
    {"CalledWantsMoreDigits", false, false, true,
     [](IsdnLossTest& test)
     {
         test.dial(test.other, "49", false);
         ASSERT_TRUE(test.waitFor("RING 49"));
         test.side->requestDigits();
         ASSERT_TRUE(test.waitForPeer("ADDRESS-INCOMPLETE"));
     }},
    {"CalledProceeds", false, false, true,
     [](IsdnLossTest& test)
     {
         test.dial(test.other, "4989123");
         ASSERT_TRUE(test.waitFor("RING 4989123."));
         test.side->proceed();
         ASSERT_TRUE(test.waitForPeer("PROCEEDING"));
     }},
    {"CalledRings", false, false, true,
     [](IsdnLossTest& test)
     {
         test.dial(test.other, "4989123");
         ASSERT_TRUE(test.waitFor("RING 4989123."));
         test.side->ring();
         ASSERT_TRUE(test.waitForPeer("ALERTING"));
     }},
    {"CalledIsUp", false, true, true, [](IsdnLossTest& test) { test.bringUpCalled(); }},
    {"CalledHolds", false, true, true,
     [](IsdnLossTest& test)
     {
         test.bringUpCalled();
         test.side->notify(PRI_NOTIFY_REMOTE_HOLD);
         ASSERT_TRUE(test.waitForPeer("HELD"));
     }},
    {"CalledIsHeld", false, true, true,
     [](IsdnLossTest& test)
     {
         test.bringUpCalled();
         std::ignore = test.other.become(FakeModule::State::HELD);
         ASSERT_TRUE(test.waitFor("NOTIFY " + std::to_string(PRI_NOTIFY_REMOTE_HOLD)));
     }},
    {"CalledIsBeingCleared", false, false, false,
     [](IsdnLossTest& test)
     {
         test.bringUpCalled();
         test.side->isSilent = true;
         test.other.hangUp();
         test.settle();
     }},
    {"CallingDialsWithoutARoute", true, false, false,
     [](IsdnLossTest& test)
     {
         test.side->call("49", false);
         ASSERT_TRUE(test.waitFor("SETUP_ACK"));
     }},
    {"CallingDials", true, false, true,
     [](IsdnLossTest& test)
     {
         test.side->call("4989", false);
         ASSERT_TRUE(test.waitForOffer());
         std::ignore = test.other.become(FakeModule::State::ADDRESS_INCOMPLETE);
         ASSERT_TRUE(test.waitFor("SETUP_ACK"));
     }},
    {"CallingProceeds", true, false, true,
     [](IsdnLossTest& test)
     {
         test.side->call("4989123");
         ASSERT_TRUE(test.waitForOffer());
         ASSERT_TRUE(test.waitFor("PROCEEDING"));
     }},
    {"CallingHearsItRing", true, false, true,
     [](IsdnLossTest& test)
     {
         test.side->call("4989123");
         ASSERT_TRUE(test.waitForOffer());
         std::ignore = test.other.become(FakeModule::State::ALERTING);
         ASSERT_TRUE(test.waitFor("RINGING"));
     }},
    {"CallingIsUp", true, true, true, [](IsdnLossTest& test) { test.bringUpCalling(); }},
    {"CallingHolds", true, true, true,
     [](IsdnLossTest& test)
     {
         test.bringUpCalling();
         test.side->notify(PRI_NOTIFY_REMOTE_HOLD);
         ASSERT_TRUE(test.waitForPeer("HELD"));
     }},
    {"CallingIsOnHold", true, true, true,
     [](IsdnLossTest& test)
     {
         test.bringUpCalling();
         test.side->hold(test.side->getCall());
         ASSERT_TRUE(test.waitFor("HOLD_ACK"));
         ASSERT_TRUE(test.waitForPeer("HELD"));
     }},
    {"CallingIsBeingCleared", true, false, false,
     [](IsdnLossTest& test)
     {
         test.bringUpCalling();
         test.side->isSilent = true;
         test.other.hangUp();
         test.settle();
     }},
};
} // namespace

TEST_P(IsdnLossTest, TheCallEndsAndLeavesNothing)
{
    FakeModule another("another");
    open();
    GetParam().bringAbout(*this);
    side.reset();
    ASSERT_TRUE(watch.runUntil([&] { return !interface->getLink().isUp(); }, std::chrono::seconds(3)));
    EXPECT_TRUE(!GetParam().isUp || other.getPeerState() != "RELEASED") << "before T309";
    dial(another, "4989124");
    EXPECT_TRUE(watch.runUntil([&] { return another.getPeerState() == "RELEASED"; }, std::chrono::seconds(3)));
    EXPECT_EQ(another.getPeerValue(CC_PropertyId::CAUSE), "Network out of order");
    if (GetParam().hasPeer)
    {
        EXPECT_TRUE(waitForPeer("RELEASED"));
        EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), OUT_OF_ORDER);
    }
    expectNothingLeft();
}

INSTANTIATE_TEST_SUITE_P(InEachState, IsdnLossTest, testing::ValuesIn(SITUATIONS),
                         [](auto const& situation) { return std::string(situation.param.name); });
