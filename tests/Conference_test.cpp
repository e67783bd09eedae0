// Transfer and conference among three and four adapters, and the choice of the peer.
#include "properties/CC_PropertyUnsigned.h"
#include "services/CC_ServiceUserInput.h"
#include "tests/support/PartyTest.h"

#include <gtest/gtest.h>

namespace
{
class Conference : public PartyTest
{
protected:
    void hangUpAll(std::initializer_list<Party*> parties)
    {
        for (Party* const party : parties)
            party->hangUp();
        settle();
        EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
        EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
    }
};

TEST_F(Conference, ATransferConnectsTheTwoPeersAndLeavesBothConsultingLegsUp)
{
    // bert holds two lines: one with anna, one with carl
    Party anna("anna");
    Party bert("bert");
    Party bert2("bert2");
    Party carl("carl");
    connect(anna, bert);
    connect(bert2, carl);
    CC_Call* const kept = bert.getCall();
    CC_Call* const left = bert2.getCall();

    ASSERT_EQ(bert.adapter->transfer(*bert2.adapter, true), XCode::OK);
    EXPECT_EQ(anna.getCall(), kept);
    EXPECT_EQ(carl.getCall(), kept);
    EXPECT_EQ(bert.getCall(), nullptr);
    EXPECT_EQ(bert2.getCall(), left);
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 2u) << "the call that bert2's leg is in survives the turn";
    auto const state = [](Party const& party)
    { return dynamic_cast<State const&>(*party.adapter->getOwnProperty(CC_PropertyId::STATE)).getState(); };
    EXPECT_EQ(state(bert), State::CONNECTED);
    EXPECT_EQ(state(bert2), State::CONNECTED);

    ASSERT_EQ(carl.say(CC_PropertyId::DISPLAY, "carl here"), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerText(CC_PropertyId::DISPLAY), "carl here");
    EXPECT_EQ(bert.peerState(), "none");
    EXPECT_EQ(bert2.peerState(), "none");
    hangUpAll({&anna, &bert, &bert2, &carl});
}

TEST_F(Conference, AConferenceHoldsEverybodyButTheOtherLineOfWhoMadeIt)
{
    Party anna("anna");
    Party bert("bert");
    Party bert2("bert2");
    Party carl("carl");
    connect(anna, bert);
    connect(bert2, carl);
    ASSERT_EQ(bert.adapter->transfer(*bert2.adapter, false), XCode::OK);
    settle();
    CC_Call const* const call = bert.getCall();
    ASSERT_NE(call, nullptr);
    EXPECT_EQ(call->getNumberOfCallLegs(), 3u);
    EXPECT_EQ(call->getState(), CC_Call::CONFERENCE);
    EXPECT_EQ(anna.getCall(), call);
    EXPECT_EQ(carl.getCall(), call);

    // a service reaches both others at once
    CC_ServiceUserInput digits("12");
    anna.adapter->invokeSynchronousService(digits);
    EXPECT_EQ(bert.observer.getServices().size(), 1u);
    EXPECT_EQ(carl.observer.getServices().size(), 1u);
    EXPECT_TRUE(anna.observer.getServices().empty());

    // one leaves, the others go on
    carl.hangUp();
    settle();
    EXPECT_EQ(call->getState(), CC_Call::ACTIVE);
    EXPECT_EQ(anna.peerState(), "CONNECTED");
    EXPECT_EQ(bert.peerState(), "CONNECTED");
    hangUpAll({&anna, &bert, &bert2});
}

TEST_F(Conference, FourAdaptersInOneCall)
{
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    Party dora("dora");
    connect(anna, bert);
    ASSERT_EQ(carl.adapter->accept(*anna.getCall(), CC_PropertyContainer::EMPTY()), XCode::OK);
    ASSERT_EQ(dora.adapter->accept(*anna.getCall(), CC_PropertyContainer::EMPTY()), XCode::OK);
    ASSERT_EQ(carl.become(State::CONNECTED), XCode::OK);
    ASSERT_EQ(dora.become(State::CONNECTED), XCode::OK);
    settle();
    EXPECT_EQ(anna.getCall()->getNumberOfCallLegs(), 4u);
    CC_ServiceUserInput digits("7", 100);
    dora.adapter->invokeSynchronousService(digits);
    for (Party const* party : {&anna, &bert, &carl})
        EXPECT_EQ(party->observer.getServices(), (Lines{"User Input: 7 (Duration: 100)"})) << party->name.c_str();
    EXPECT_TRUE(dora.observer.getServices().empty());
    hangUpAll({&anna, &bert, &carl, &dora});
}

TEST_F(Conference, TransferWithinOneCallIsRefused)
{
    Party anna("anna");
    Party bert("bert");
    connect(anna, bert);
    EXPECT_EQ(anna.adapter->transfer(*bert.adapter, true), XCode::REFUSED);
    EXPECT_EQ(anna.getCall(), bert.getCall());
    hangUpAll({&anna, &bert});
}

TEST_F(Conference, ALegThatBecomesMoreActiveThanThePeerTakesOver)
{
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(bert.become(State::ALERTING), XCode::OK);
    ASSERT_EQ(carl.adapter->accept(*anna.getCall(), CC_PropertyContainer::EMPTY()), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerText(CC_PropertyId::NETWORK), "bert");
    ASSERT_EQ(carl.become(State::ALERTING), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerText(CC_PropertyId::NETWORK), "bert") << "equally active: the peer stays";
    ASSERT_EQ(carl.become(State::CONNECTED), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerText(CC_PropertyId::NETWORK), "carl");
    ASSERT_EQ(carl.become(State::DISCONNECTING), XCode::OK);
    settle();
    EXPECT_EQ(anna.peerText(CC_PropertyId::NETWORK), "bert") << "a peer that falls back makes way";
    hangUpAll({&anna, &bert, &carl});
}

TEST_F(Conference, APeerSwitchReportsOnlyWhatDiffersAndAnUnlinkEverything)
{
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(carl.adapter->accept(*anna.getCall(), CC_PropertyContainer::EMPTY()), XCode::OK);
    settle();
    anna.observer.take();
    ASSERT_EQ(carl.become(State::CONNECTED), XCode::OK);
    settle();
    EXPECT_EQ(anna.observer.take(), (Lines{"anna: peer changed (Network, Call-Leg-ID, State)"}));

    CC_Call* const call = anna.getCall();
    call->removeCallLeg(*call->getOtherCallLeg(0, *call->getCallLeg(0)));
    call->removeCallLeg(*call->getOtherCallLeg(0, *call->getCallLeg(0)));
    settle();
    EXPECT_EQ(anna.observer.take().back(), "anna: peer changed (Network, Call-Leg-ID, Provides Data, Cause, State)");
    EXPECT_EQ(anna.peerState(), "none");
    hangUpAll({&anna, &bert, &carl});
}
} // namespace
