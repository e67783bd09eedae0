#include "IsdnFixture.h"

#include <spdlog/sinks/ostream_sink.h>

#include <sstream>

namespace
{
struct IsdnCallingTest : IsdnFixture
{
    bool waitForOffer()
    {
        return watch.runUntil([&] { return other.getCall() != nullptr; }, std::chrono::seconds(3));
    }
};
} // namespace

TEST_F(IsdnCallingTest, ACallRingsIsAnsweredAndCleared)
{
    open();
    side->call("4989123");
    ASSERT_TRUE(waitForOffer());
    EXPECT_EQ(other.m_endpoint.getName(), "other");
    EXPECT_TRUE(waitFor("PROCEEDING"));
    std::ignore = other.become(FakeModule::State::ALERTING);
    EXPECT_TRUE(waitFor("RINGING"));
    std::ignore = other.become(FakeModule::State::CONNECTED);
    EXPECT_TRUE(waitFor("ANSWER"));
    side->clear(16);
    EXPECT_TRUE(waitForPeer("RELEASED"));
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), "Normal call clearing");
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, TheOtherSideClearsWithEachCause)
{
    open();
    for (int cause = 1; cause <= 127; ++cause)
    {
        side->call("4989123");
        ASSERT_TRUE(waitForOffer());
        other.hangUp(static_cast<QCause>(cause));
        bool const isAtOnce = cause == 6 || cause == 7 || cause == 26 || cause == 81; // Q.931, 5.3.2: no DISCONNECT
        EXPECT_TRUE(waitFor((isAtOnce ? "HANGUP " : "HANGUP_REQ ") + std::to_string(cause)));
        side->take();
        expectNothingLeft();
    }
}

TEST_F(IsdnCallingTest, NothingIsAskedOfACallThatTheStackHasGivenUp)
{
    std::ostringstream log;
    auto const before = spdlog::default_logger();
    spdlog::set_default_logger(
        std::make_shared<spdlog::logger>("test", std::make_shared<spdlog::sinks::ostream_sink_st>(log)));
    spdlog::set_level(spdlog::level::debug);
    open();
    for (bool const isClearedByWire : {true, false})
        for (bool const isUp : {true, false})
        {
            side->call("4989123");
            ASSERT_TRUE(waitForOffer());
            if (isUp)
                std::ignore = other.become(FakeModule::State::CONNECTED);
            settle();
            isClearedByWire ? side->clear(16) : other.hangUp();
            expectNothingLeft();
            other.hangUp();
        }
    spdlog::set_default_logger(before);
    spdlog::set_level(spdlog::level::off);
    EXPECT_NE(log.str().find("released: cause 16"), std::string::npos);
    EXPECT_EQ(log.str().find("invalid call"), std::string::npos) << log.str();
}

TEST_F(IsdnCallingTest, ANationalNumberIsDialledAsAnInternationalOneWhereTheCountryIsKnown)
{
    dialPlan = {"00", "0", "49"};
    open();
    auto const call = [&](int type, char const* calling)
    {
        side->call("89123", true, 20, false,
                   [&](pri_sr* request)
                   {
                       char called[] = "89123";
                       pri_sr_set_called(request, called, type << 4 | PRI_NPI_E163_E164, 1);
                       pri_party_id caller = {};
                       caller.number.valid = 1;
                       caller.number.plan = type << 4 | PRI_NPI_E163_E164;
                       std::strcpy(caller.number.str, calling);
                       pri_sr_set_caller_party(request, &caller);
                   });
        ASSERT_TRUE(waitForOffer());
    };
    call(PRI_TON_NATIONAL, "30123");
    EXPECT_NE(other.take().front().find(" +4989123 "), std::string::npos);
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::E164_NUMBER), "4930123");
    EXPECT_EQ(other.m_adapter->getPeerTypeOfNumber(), QTypeOfNumber::INTERNATIONAL);
    other.hangUp();
    expectNothingLeft();
    call(PRI_TON_SUBSCRIBER, "30123");
    EXPECT_NE(other.take().front().find(" 89123 "), std::string::npos);
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::E164_NUMBER), "30123");
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, TheCallerGivesUpInEachState)
{
    open();
    for (unsigned int state = 0; state < 4; ++state)
    {
        side->call("4989123");
        ASSERT_TRUE(waitForOffer());
        if (state > 0)
            std::ignore = other.become(state == 1   ? FakeModule::State::PROCEEDING
                                       : state == 2 ? FakeModule::State::ALERTING
                                                    : FakeModule::State::CONNECTED);
        settle();
        side->clear(16);
        EXPECT_TRUE(waitForPeer("RELEASED")) << state;
        other.hangUp();
        expectNothingLeft();
    }
}

TEST_F(IsdnCallingTest, TheNextRouteIsTriedUponTheCausesThatTheRouteNamesWhileNobodyWasReached)
{
    routes.front().nextOn = {34};
    routes.push_back({NAME, {}, "other"});
    routes.back().prepend = "9";
    open();
    side->call("4989123");
    ASSERT_TRUE(waitForOffer());
    EXPECT_TRUE(waitFor("PROCEEDING"));
    CC_Call const* const first = other.getCall();
    other.hangUp(QCause::NO_CIRCUIT_CHANNEL_AVAILABLE);
    ASSERT_TRUE(watch.runUntil([&] { return other.getCall() != nullptr && other.getCall() != first; }));
    std::ignore = other.become(FakeModule::State::ALERTING);
    EXPECT_TRUE(waitFor("RINGING"));
    EXPECT_EQ(counters.failed, 0u);
    other.hangUp(QCause::NO_CIRCUIT_CHANNEL_AVAILABLE); // somebody has heard it ring
    EXPECT_TRUE(waitFor("HANGUP_REQ 34"));
    side->take();
    expectNothingLeft();
    EXPECT_EQ(counters.failed, 1u);
}

TEST_F(IsdnCallingTest, ACauseThatTheRouteDoesNotNameEndsTheCall)
{
    routes.front().nextOn = {34};
    routes.push_back({NAME, {}, "other"});
    open();
    side->call("4989123");
    ASSERT_TRUE(waitForOffer());
    other.hangUp(QCause::USER_BUSY);
    EXPECT_TRUE(waitFor("HANGUP_REQ 17"));
    side->take();
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, ANumberWithoutARouteIsRefused)
{
    open();
    side->call("49");
    EXPECT_TRUE(watch.runUntil([&] { return side->has("HANGUP 3") || side->has("HANGUP_REQ 3"); }));
    expectNothingLeft();
    EXPECT_EQ(counters.failed, 1u);
}

TEST_F(IsdnCallingTest, DigitsAreCollectedUntilTheNumberIsComplete)
{
    configuration.timers.t302 = 100;
    open();
    side->call("49", false);
    ASSERT_TRUE(waitFor("SETUP_ACK"));
    for (char const digit : {'8', '9', '1'})
        side->dial(digit);
    settle();
    ASSERT_TRUE(waitForOffer()) << "T302";
    EXPECT_NE(testing::PrintToString(other.take()).find("49891"), std::string::npos);
    EXPECT_TRUE(waitFor("PROCEEDING"));
}

TEST_F(IsdnCallingTest, AHashEndsTheNumber)
{
    open();
    side->call("498", false);
    ASSERT_TRUE(waitFor("SETUP_ACK"));
    side->dial('9');
    side->dial('#');
    ASSERT_TRUE(waitForOffer());
}

TEST_F(IsdnCallingTest, DigitsAreHandedOnOneByOne)
{
    configuration.collects = false;
    open();
    side->call("49", false);
    ASSERT_TRUE(waitFor("SETUP_ACK")) << "no route yet";
    side->dial('8');
    side->dial('9');
    ASSERT_TRUE(waitForOffer());
    std::ignore = other.become(FakeModule::State::ADDRESS_INCOMPLETE);
    settle();
    other.take();
    side->dial('7');
    settle();
    EXPECT_NE(testing::PrintToString(other.take()).find("7"), std::string::npos);
    std::ignore = other.become(FakeModule::State::ALERTING);
    EXPECT_TRUE(waitFor("RINGING"));
}

TEST_F(IsdnCallingTest, ANumberThatStaysIncompleteIsCleared)
{
    configuration.collects = false;
    configuration.timers.t302 = 100;
    open();
    side->call("4989", false);
    ASSERT_TRUE(waitForOffer());
    std::ignore = other.become(FakeModule::State::ADDRESS_INCOMPLETE);
    EXPECT_TRUE(waitFor("HANGUP_REQ 28"));
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, WhoWaitsForTheWholeNumberIsToldThatItIs)
{
    configuration.collects = false;
    configuration.timers.t302 = 100;
    open();
    side->call("4989", false);
    ASSERT_TRUE(waitForOffer());
    std::ignore = other.say(CC_PropertyBoolean(CC_PropertyId::SUPPORTS_OVERLAP_RECEIVING, false));
    std::ignore = other.become(FakeModule::State::ADDRESS_INCOMPLETE);
    EXPECT_TRUE(watch.runUntil([&] { return other.getPeerValue(CC_PropertyId::SUPPORTS_OVERLAP_SENDING) == "false"; }));
    std::ignore = other.become(FakeModule::State::ALERTING);
    EXPECT_TRUE(waitFor("RINGING"));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, ADiallerWhoStopsWithoutADigit)
{
    configuration.timers.t302 = 100;
    open();
    side->call("", false);
    ASSERT_TRUE(waitFor("SETUP_ACK"));
    EXPECT_TRUE(waitFor("HANGUP_REQ 28"));
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, TonesOfTheOtherSideAreTold)
{
    open();
    side->call("4989123");
    ASSERT_TRUE(waitForOffer());
    ASSERT_TRUE(waitFor("PROCEEDING"));
    std::ignore = other.say(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    EXPECT_TRUE(waitFor("PROGRESS in band"));
    std::ignore = other.become(FakeModule::State::ALERTING);
    EXPECT_TRUE(waitFor("RINGING in band"));
}

TEST_F(IsdnCallingTest, ThePreferredChannelIsTakenAnotherIfItIsNotFree)
{
    open();
    side->call("4989123", true, 20);
    ASSERT_TRUE(waitForOffer());
    EXPECT_FALSE(interface->getChannels().isFree(20));
    FakeModule third("third");
    routes.front().to = "third";
    side->take();
    side->call("4989123", true, 20);
    ASSERT_TRUE(watch.runUntil([&] { return third.getCall() != nullptr; }));
    ASSERT_TRUE(waitFor("PROCEEDING"));
    EXPECT_EQ(side->getChannel(), 1);
    FakeModule fourth("fourth");
    routes.front().to = "fourth";
    side->take();
    side->call("4989123", true, 20, true);
    EXPECT_TRUE(watch.runUntil([&] { return side->has("HANGUP 44") || side->has("HANGUP_REQ 44"); }));
    EXPECT_EQ(fourth.getCall(), nullptr);
    EXPECT_EQ(counters.failed, 1u);
}

TEST_F(IsdnCallingTest, ACallThatIsNotAdmittedIsRefused)
{
    environment.beginCall = [](std::string const&) { return 0u; };
    open();
    side->call("4989123");
    EXPECT_TRUE(watch.runUntil([&] { return side->has("HANGUP 42") || side->has("HANGUP_REQ 42"); }));
    EXPECT_EQ(interface->getNumberOfEndpoints(), 0u);
}

TEST_F(IsdnCallingTest, ARestartOfAChannelLeavesTheOthers)
{
    open();
    side->call("4989123", true, 20);
    ASSERT_TRUE(waitForOffer());
    std::ignore = other.become(FakeModule::State::CONNECTED);
    ASSERT_TRUE(waitFor("ANSWER"));
    FakeModule third("third");
    routes.front().to = "third";
    side->take();
    side->call("4989123", true, 21);
    ASSERT_TRUE(watch.runUntil([&] { return third.getCall() != nullptr; }));
    std::ignore = third.become(FakeModule::State::CONNECTED);
    ASSERT_TRUE(waitFor("ANSWER"));
    side->ask([](pri* stack) { return pri_reset(stack, 21); });
    EXPECT_TRUE(watch.runUntil([&] { return third.getPeerState() == "RELEASED"; }, std::chrono::seconds(3)));
    EXPECT_TRUE(waitFor("RESTART_ACK"));
    third.hangUp();
    EXPECT_TRUE(watch.runUntil([&] { return interface->getChannels().isFree(21); }, std::chrono::seconds(3)));
    EXPECT_EQ(other.getPeerState(), "CONNECTED");
    EXPECT_FALSE(interface->getChannels().isFree(20));
    side->take();
    routes.front().to = "third";
    side->call("4989123", true, 21);
    EXPECT_TRUE(watch.runUntil([&] { return third.getCall() != nullptr; })) << "it serves again";
    third.hangUp();
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnCallingTest, ARestartClearsTheCall)
{
    open();
    side->call("4989123", true, 20);
    ASSERT_TRUE(waitForOffer());
    std::ignore = other.become(FakeModule::State::CONNECTED);
    ASSERT_TRUE(waitFor("ANSWER"));
    side->ask([](pri* stack) { return pri_reset(stack, 20); });
    EXPECT_TRUE(waitForPeer("RELEASED"));
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), "Temporary failure");
    EXPECT_TRUE(waitFor("RESTART_ACK"));
    expectNothingLeft();
}
