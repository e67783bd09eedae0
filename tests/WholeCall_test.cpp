// Calls between two modules, from dial to the clean-up.
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyUnsigned.h"
#include "testing/CallControlFixture.h"
#include "testing/FakeRebootMgmt.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/Party.h"

#include <gtest/gtest.h>

namespace
{
class WholeCall : public testing::Test
{
protected:
    unsigned int calls() const { return CallControl::GET_NUMBER_OF_CALLS("SWITCH"); }
    void turn() { fixture.m_loop.turn(); }
    void settle() { fixture.m_loop.settle(); }

    CallControlFixture fixture;
};

TEST_F(WholeCall, DialRingAnswerAndHangUpByTheCaller)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    EXPECT_EQ(calls(), 1u);
    turn();
    EXPECT_EQ(anna.peerState(), "TRYING");
    EXPECT_EQ(bert.peerState(), "CONNECTED") << "the calling side counts as connected from the start";
    for (State::State const state : {State::PROCEEDING, State::ALERTING, State::CONNECTED})
    {
        ASSERT_EQ(bert.become(state), XCode::OK);
        turn();
        EXPECT_EQ(anna.peerState(), State::STATE_NAME(state));
    }
    EXPECT_EQ(anna.getCall()->getState(), CC_Call::ACTIVE);

    anna.hangUp();
    settle();
    EXPECT_EQ(bert.peerState(), "RELEASED");
    EXPECT_EQ(bert.peerCause(), QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(calls(), 1u) << "as long as bert's leg is up";
    bert.hangUp();
    settle();
    EXPECT_EQ(calls(), 0u);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

TEST_F(WholeCall, HangUpByTheCallee)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    settle();
    bert.hangUp(QCause::DESTINATION_OUT_OF_ORDER);
    settle();
    EXPECT_EQ(anna.peerState(), "RELEASED");
    EXPECT_EQ(anna.peerCause(), QCause::DESTINATION_OUT_OF_ORDER);
    anna.hangUp();
    settle();
    EXPECT_EQ(calls(), 0u);
}

TEST_F(WholeCall, TheCallerGivesUpBeforeAnAnswer)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(bert.become(State::ALERTING), XCode::OK);
    anna.hangUp();
    settle();
    EXPECT_EQ(bert.peerState(), "RELEASED");
    bert.hangUp();
    settle();
    EXPECT_EQ(calls(), 0u);
}

TEST_F(WholeCall, ARejectedOfferReachesTheCallerWithItsCause)
{
    Party anna("anna");
    Party bert("bert");
    bert.endpoint.m_handleOffer = [&](CC_Call& call, String const&, CC_PropertyContainer const& properties)
    {
        bert.endpoint.actionRejectOfferedCall_WithCause(call, properties, QCause::USER_BUSY);
        return XCode::OK;
    };
    QCause heard = QCause::UNSPECIFIED;
    anna.observer.m_onPeerPropertyChange = [&](CC_CallAdapter& adapter, CC_Flags const&)
    {
        if (anna.peerState() == "RELEASED")
        {
            heard = anna.peerCause();
            adapter.drop(heard, 0);
        }
    };
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    settle();
    EXPECT_EQ(heard, QCause::USER_BUSY);
    EXPECT_EQ(calls(), 0u);
}

TEST_F(WholeCall, AProviderThatRefusesLeavesTheCallerIdleWithNothingUp)
{
    Party anna("anna");
    Party bert("bert");
    bert.provider.m_dial = [](CC_Call&, String const&, String const&, CC_PropertyContainer const&)
    { return XCode(0x40000004); };
    EXPECT_EQ(anna.dial(bert), XCode::FAILURE);
    EXPECT_EQ(anna.getCall(), nullptr);
    settle();
    EXPECT_EQ(calls(), 0u);
    bert.provider.m_dial = [&](CC_Call& call, String const&, String const& to, CC_PropertyContainer const& offered)
    { return bert.endpoint.offer(call, to, offered); };
    EXPECT_EQ(anna.dial(bert), XCode::OK) << "and able to dial again";
}

TEST_F(WholeCall, ACallIsClearedWhileOthersOfThePoolGoOn)
{
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    Party dora("dora");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(carl.dial(dora), XCode::OK);
    settle();
    EXPECT_EQ(calls(), 2u);
    anna.hangUp();
    bert.hangUp();
    settle();
    EXPECT_EQ(calls(), 1u);
    EXPECT_EQ(CallControl::GET_CALL("SWITCH", 0), carl.getCall());
    ASSERT_EQ(dora.become(State::ALERTING), XCode::OK);
    settle();
    EXPECT_EQ(carl.peerState(), "ALERTING");
}

TEST_F(WholeCall, AContextDestroyedUnderItsCallsLeavesThemUpUntilTheirAdaptersDrop)
{
    FakeRebootMgmt reboot;
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    settle();
    CallControl::DESTROY_CONTEXT("SWITCH");
    ASSERT_NE(anna.getCall(), nullptr);
    EXPECT_EQ(anna.getCall()->getCallPool(), nullptr);
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerState(), "CONNECTED");
    anna.hangUp();
    bert.hangUp();
    settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1) << "the lock of a pool that ended with calls up stays held";
}

TEST_F(WholeCall, AProviderRemovedUnderItsCallsDoesNotDisturbThem)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    CallControl::REMOVE_PROVIDER("SWITCH", "bert");
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerState(), "CONNECTED");
    Party carl("carl");
    EXPECT_EQ(carl.dial(bert), XCode::FAILURE) << "new calls do not find it any more";
    anna.hangUp();
    bert.hangUp();
    settle();
    EXPECT_EQ(calls(), 0u);
}

TEST_F(WholeCall, TheReloadLockIsHeldFromTheFirstCallToTheLast)
{
    FakeRebootMgmt reboot;
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    Party dora("dora");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(carl.dial(dora), XCode::OK);
    EXPECT_EQ(reboot.take(), (Lines{"reboot: add Call-Control (Calls are ongoing, 0)"}));
    for (Party* party : {&anna, &bert})
        party->hangUp();
    settle();
    EXPECT_EQ(reboot.take(), Lines());
    for (Party* party : {&carl, &dora})
        party->hangUp();
    settle();
    EXPECT_EQ(reboot.take(), (Lines{"reboot: release Call-Control"}));
}

TEST_F(WholeCall, TwoLinesOfOneNetworkAreAskedToStepBack)
{
    Party anna("anna", "pstn");
    Party bert("bert", "pstn");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    settle();
    ASSERT_EQ(bert.become(State::PROCEEDING), XCode::OK);
    settle();
    EXPECT_TRUE(anna.observer.getServices().empty()) << "not while the called side is below alerting";
    ASSERT_EQ(bert.become(State::ALERTING), XCode::OK);
    settle();
    // bert's leg is the less active one, so the other side of the call hears of it
    String id;
    id.format("Push Back: %llu",
              static_cast<unsigned long long>(
                  dynamic_cast<CC_PropertyUnsigned const&>(*bert.adapter->getOwnProperty(CC_PropertyId::CALL_LEG_ID))
                      .getValue()));
    EXPECT_EQ(anna.observer.getServices(), (Lines{id.c_str()}));
    EXPECT_TRUE(bert.observer.getServices().empty());
    EXPECT_EQ(calls(), 1u) << "nobody but the module ends anything";
}

TEST_F(WholeCall, FiltersOnBothSidesRemoveRewriteAndDerive)
{
    // anna's line hides her name; bert's line shows numbers with a prefix and derives a display text
    RecordingPropertyFilter hideName("hide");
    hideName.onApply(
        [](CC_PropertyContainer& properties)
        {
            properties.remove(CC_PropertyId::NAME);
            return XCode::OK;
        });
    RecordingPropertyFilter present("present");
    present.onApply(
        [](CC_PropertyContainer& properties)
        {
            auto const* const number =
                dynamic_cast<CC_PropertyString const*>(properties.get(CC_PropertyId::E164_NUMBER));
            if (number == nullptr)
                return XCode::OK;
            String const prefixed = String("00") + number->getValue();
            std::ignore = properties.set(CC_PropertyString(CC_PropertyId::DISPLAY, String("call from ") + prefixed));
            return properties.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, prefixed));
        });
    CC_PropertyFilterContainer input;
    CC_PropertyFilterContainer output;
    ASSERT_EQ(input.addFilter(hideName), XCode::OK);
    ASSERT_EQ(output.addFilter(present), XCode::OK);
    Party anna("anna", "", nullptr, &input, nullptr);
    Party bert("bert", "", nullptr, nullptr, &output);

    CC_PropertyContainer own;
    ASSERT_EQ(own.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")), XCode::OK);
    ASSERT_EQ(own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, "4420791234")), XCode::OK);
    ASSERT_EQ(anna.dial(bert, own), XCode::OK);
    settle();
    EXPECT_EQ(bert.peerText(CC_PropertyId::NAME), "none");
    EXPECT_EQ(bert.peerText(CC_PropertyId::E164_NUMBER), "004420791234");
    EXPECT_EQ(bert.peerText(CC_PropertyId::DISPLAY), "call from 004420791234");
    String text;
    EXPECT_STREQ(bert.adapter->getPeerPropertyUnfiltered(CC_PropertyId::E164_NUMBER)->getValueString(text).c_str(),
                 "4420791234");
}

TEST_F(WholeCall, AnAdapterServesOneCallAfterAnother)
{
    Party anna("anna");
    Party bert("bert");
    for (int i = 0; i < 3; ++i)
    {
        ASSERT_EQ(anna.dial(bert), XCode::OK);
        EXPECT_EQ(anna.dial(bert), XCode::REFUSED) << "not while it has a leg";
        settle();
        anna.hangUp();
        bert.hangUp();
        settle();
        EXPECT_EQ(calls(), 0u);
    }
}
} // namespace
