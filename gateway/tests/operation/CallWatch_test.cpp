#include "operation/record/CallWatch.h"

#include "callcontrol/CallControl.h"
#include "operation/record/CallLine.h"
#include "properties/CC_PropertyKeys.h"
#include "testing/CallControlFixture.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeModule.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <optional>
#include <tuple>
#include <vector>

namespace
{
using State = CC_PropertyCallLegState;

struct CallWatchTest : testing::Test
{
    CallWatchTest()
    {
        watch.tell([this](CallRecord const& record) { records.push_back(record); });
        watch.watch("SWITCH");
        caller.emplace("anna", "north");
        callee.emplace("bert", "south");
        caller->setNumber("4420");
        callee->setNumber("4989123");
    }
    void run() { fixture.settle(); }

    CallWatch watch; // before the context ends
    std::vector<CallRecord> records;
    CallControlFixture fixture;
    std::optional<FakeModule> caller, callee;
};

TEST_F(CallWatchTest, TellsOfACallOnceItIsOver)
{
    EXPECT_TRUE(caller->dial(*callee).isOk());
    std::ignore = callee->become(State::ALERTING);
    std::ignore = callee->become(State::CONNECTED);
    run();
    EXPECT_TRUE(records.empty());
    ASSERT_NE(watch.find(caller->getCall()->getSerial()), nullptr);
    unsigned long long const serial = caller->getCall()->getSerial();
    callee->hangUp(QCause::USER_BUSY);
    caller->hangUp();
    run();
    ASSERT_EQ(records.size(), 1u);
    CallRecord const& record = records.front();
    EXPECT_EQ(record.serial, serial);
    ASSERT_EQ(record.legs.size(), 2u);
    EXPECT_EQ(record.getCaller()->interface, "north");
    EXPECT_EQ(record.getCaller()->number, "4420");
    EXPECT_EQ(record.getCalled()->interface, "south");
    EXPECT_EQ(record.getCalled()->dialled, "4989123");
    EXPECT_TRUE(record.ringing.has_value());
    EXPECT_TRUE(record.answered.has_value());
    EXPECT_GE(record.ended, *record.answered);
    EXPECT_EQ(record.getClearing(), record.getCalled());
    EXPECT_EQ(record.getClearing()->cause, 17);
    EXPECT_FALSE(record.isClearedByGateway);
    EXPECT_EQ(watch.find(serial), nullptr);
}

TEST_F(CallWatchTest, TellsOfACallThatNobodyAnswered)
{
    EXPECT_TRUE(caller->dial(*callee).isOk());
    caller->hangUp();
    callee->hangUp();
    run();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_FALSE(records.front().ringing.has_value());
    EXPECT_FALSE(records.front().answered.has_value());
    EXPECT_EQ(records.front().getClearing(), records.front().getCaller());
}

TEST_F(CallWatchTest, SaysThatTheGatewayClearedACall)
{
    EXPECT_TRUE(caller->dial(*callee).isOk());
    watch.noteCleared(caller->getCall()->getSerial());
    watch.noteCleared(99999);
    caller->hangUp();
    callee->hangUp();
    run();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_TRUE(records.front().isClearedByGateway);
}

TEST_F(CallWatchTest, TellsOfCallsThatEndWithTheContext)
{
    EXPECT_TRUE(caller->dial(*callee).isOk());
    caller.reset();
    callee.reset();
    CallControl::DESTROY_CONTEXT("SWITCH");
    run();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_TRUE(CallControl::CREATE_CONTEXT("SWITCH").isOk());
}

TEST_F(CallWatchTest, CountsACallOfWhichItCannotTellForWantOfMemory)
{
    unsigned long long wasLost = 0;
    for (unsigned long n = 1; n < 100; ++n)
    {
        FailingAllocator::failNth(n);
        std::ignore = caller->dial(*callee);
        std::ignore = callee->become(State::CONNECTED);
        FailingAllocator::stop();
        caller->hangUp();
        callee->hangUp();
        run();
        caller->renew();
        callee->renew();
        wasLost = std::max(wasLost, watch.getNumberOfLost());
    }
    EXPECT_GT(wasLost, 0u);
    EXPECT_FALSE(records.empty());
}

CallRecord RECORD()
{
    CallRecord record;
    record.serial = 12;
    record.answered = 2.1337;
    record.ended = 65.25;
    record.clearedBy = 2;
    record.legs.resize(2);
    record.legs[0].serial = 1;
    record.legs[0].isCalling = true;
    record.legs[0].interface = "a";
    record.legs[0].number = "4420";
    record.legs[0].id = "x@h";
    record.legs[1].serial = 2;
    record.legs[1].interface = "b";
    record.legs[1].number = "4989123";
    record.legs[1].cause = 16;
    return record;
}

TEST(CallLine, HasWhatSomebodyWhoLooksForACallKnowsOfIt)
{
    CallRecord record = RECORD();
    EXPECT_EQ(CallLine::TEXT_OF(record),
              "call 12: 4420 on a to 4989123 on b, answered after 2.134 s, over after 65.250 s, cleared by b, cause 16 "
              "(normal-call-clearing), ids x@h");
    record.legs[1].sipStatus = 486;
    record.legs[1].causeText = "Busy\nnow";
    record.legs[1].id = "y";
    record.answered.reset();
    record.isClearedByGateway = true;
    EXPECT_EQ(CallLine::TEXT_OF(record),
              "call 12: 4420 on a to 4989123 on b, not answered, over after 65.250 s, cleared by the gateway, cause 16 "
              "(normal-call-clearing), SIP 486, \"Busy\\x0anow\", ids x@h and y");
}

TEST(CallLine, WithholdsWhatMayNotBePresented)
{
    CallRecord record = RECORD();
    record.legs[0].presentation = CallRecord::Presentation::RESTRICTED;
    record.legs[1].presentation = CallRecord::Presentation::NOT_AVAILABLE;
    record.legs[1].number.clear();
    EXPECT_NE(CallLine::TEXT_OF(record).find("call 12: (withheld) on a to (none) on b,"), std::string::npos);
}

TEST(CallLine, OfACallWithoutLegsOrOfManySaysSo)
{
    CallRecord record;
    EXPECT_EQ(CallLine::TEXT_OF(record), "call 0: nobody to nobody, not answered, over after 0.000 s");
    record.legs.resize(3);
    EXPECT_NE(CallLine::TEXT_OF(record).find("3 parties in all"), std::string::npos);
}
} // namespace
