#include "testing/FakeModule.h"

#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/CallControlFixture.h"
#include "testing/FailingAllocator.h"
#include "testing/LeakCheck.h"
#include "testing/PropertyNames.h"

#include <gtest/gtest.h>
#include <memory>

using State = FakeModule::State;

namespace
{
struct FakeModules : testing::Test, CallControlFixture
{
    Journal journal;
    FakeModule anna{"anna", "", &journal};
    FakeModule bert{"bert", "", &journal};
};
} // namespace

TEST_F(FakeModules, HoldACall)
{
    anna.setNumber("4420791234");
    bert.setNumber("4989123");
    EXPECT_EQ(anna.dial(bert, "4989123"), XCode::OK);
    EXPECT_EQ(bert.become(State::ALERTING), XCode::OK);
    settle();
    EXPECT_EQ(journal.getLines().front(), "bert: dial bert 4989123 (E164-Number)");
    EXPECT_TRUE(journal.contains("bert: offer 4989123 (E164-Number)"));
    EXPECT_EQ(anna.getPeerState(), "ALERTING");
    EXPECT_EQ(anna.getPeerValue(CC_PropertyId::E164_NUMBER), "4989123");
    EXPECT_EQ(bert.getPeerValue(CC_PropertyId::E164_NUMBER), "4420791234");
    EXPECT_EQ(bert.getOwnValue(CC_PropertyId::E164_NUMBER), "4989123");
    EXPECT_EQ(bert.getOwnValue(CC_PropertyId::DISPLAY), "absent");
    EXPECT_EQ(anna.getCall(), bert.getCall());

    journal.clear();
    EXPECT_EQ(anna.say(CC_PropertyId::DISPLAY, "hello"), XCode::OK);
    settle();
    EXPECT_EQ(journal.take(), Lines{"bert: peer changed (Display)"});
    EXPECT_EQ(bert.m_observer.getValues().back(), "Display: hello");

    anna.key("12");
    EXPECT_EQ(journal.take(), Lines{"bert: peer asked (User Input: 12 (Duration: Unknown))"});
    bert.hangUp(QCause::USER_BUSY);
    settle();
    EXPECT_EQ(anna.getPeerState(), "RELEASED");
    EXPECT_EQ(anna.getPeerValue(CC_PropertyId::CAUSE), "User busy");
    anna.hangUp();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 0u);
}

TEST_F(FakeModules, RejectWhatTheyAreOffered)
{
    bert.rejectOffers(QCause::CALL_REJECTED);
    EXPECT_EQ(anna.dial(bert), XCode::OK);
    EXPECT_EQ(bert.getCall(), nullptr);
    settle();
    EXPECT_EQ(anna.getPeerState(), "RELEASED");
    EXPECT_EQ(anna.getPeerValue(CC_PropertyId::CAUSE), "Call rejected");
}

TEST_F(FakeModules, HoldAnOfferUntilTheTestAcceptsIt)
{
    bert.holdOffers();
    EXPECT_EQ(anna.dial(bert), XCode::OK);
    EXPECT_TRUE(bert.isHolding());
    EXPECT_EQ(anna.getPeerState(), "none");
    EXPECT_EQ(bert.acceptHeld(), XCode::OK);
    EXPECT_FALSE(bert.isHolding());
    settle();
    EXPECT_EQ(anna.getPeerState(), "TRYING");
    EXPECT_EQ(bert.acceptHeld(), XCode::ABSENT);
}

TEST_F(FakeModules, HoldAnOfferUntilTheTestRejectsIt)
{
    bert.holdOffers();
    EXPECT_EQ(anna.dial(bert), XCode::OK);
    bert.rejectHeld(QCause::NO_USER_RESPONDING);
    bert.rejectHeld(QCause::NO_USER_RESPONDING);
    settle();
    EXPECT_EQ(anna.getPeerState(), "RELEASED");
}

TEST_F(FakeModules, HoldAnOfferUntilTheCallerGivesUp)
{
    bert.holdOffers();
    EXPECT_EQ(anna.dial(bert), XCode::OK);
    anna.hangUp();
    settle();
    EXPECT_FALSE(bert.isHolding());
    EXPECT_EQ(bert.acceptHeld(), XCode::ABSENT);
}

TEST_F(FakeModules, RejectASecondOffer)
{
    FakeModule carl("carl");
    EXPECT_EQ(anna.dial(bert), XCode::OK);
    EXPECT_EQ(carl.dial(bert), XCode::OK);
    settle();
    EXPECT_EQ(carl.getPeerValue(CC_PropertyId::CAUSE), "User busy");
    EXPECT_EQ(anna.getPeerState(), "TRYING");
}

TEST_F(FakeModules, OfferTheNumberThatTheTestPutsIntoTheOffer)
{
    CC_PropertyContainer offer;
    EXPECT_EQ(offer.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, "115")), XCode::OK);
    std::string offered;
    bert.m_endpoint.m_handleOffer = [&](CC_Call&, String const&, CC_PropertyContainer const& properties)
    {
        offered = PROPERTY_VALUES(properties);
        return XCode::OK;
    };
    auto const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(anna.dial("bert", "trunk", none, offer, none), XCode::OK);
    EXPECT_EQ(offered.find("E164-Number: 115"), 0u);
}

TEST_F(FakeModules, LetNothingOfTheirOwnFail)
{
    CC_PropertyContainer const empty;
    unsigned long failures = 0;
    for (unsigned long n = 1;; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const dialled = anna.dial(bert);
        FailingAllocator::stop();
        settle();
        anna.hangUp();
        bert.hangUp();
        settle();
        if (!FailingAllocator::hasFailed())
            break;
        failures += dialled.isOk() ? 0 : 1;
    }
    EXPECT_GT(failures, 0u);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 0u);
}

TEST(FakeModule, MayDestroyItsAdapterAndMakeANewOne)
{
    LeakCheck const check;
    {
        CallControlFixture callControl;
        FakeModule anna("anna");
        FakeModule bert("bert");
        EXPECT_EQ(anna.dial(bert), XCode::OK);
        bert.m_adapter.reset();
        bert.hangUp();
        EXPECT_EQ(bert.getCall(), nullptr);
        callControl.settle();
        EXPECT_EQ(anna.getPeerState(), "RELEASED");
        anna.renew();
        bert.renew();
        EXPECT_EQ(anna.dial(bert), XCode::OK);
        EXPECT_EQ(CallControl::GET_NUMBER_OF_PROVIDERS("SWITCH"), 2u);
    }
    EXPECT_EQ(check.compare(), "");
}

TEST(FakeModuleDeathTest, ANameThatIsTakenIsRefusedClearly)
{
    CallControlFixture const callControl;
    FakeModule const anna("anna");
    EXPECT_DEATH(FakeModule("anna"), "no other module of that name");
}
