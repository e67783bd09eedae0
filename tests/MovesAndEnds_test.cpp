// What observers do to a leg on its move and to a call at its end. Each of these once touched freed memory or left
// something behind for ever.
#include "testing/FakeRebootMgmt.h"
#include "testing/RecordingCallObserver.h"
#include "tests/support/PartyTest.h"

using MovesAndEnds = PartyTest;

TEST_F(MovesAndEnds, EveryLegGoesThoughAnObserverCleansUpInBetween)
{
    Party anna("anna"), bert("bert");
    RecordingCallObserver observer("observer");
    connect(anna, bert);
    CC_Call* const call = anna.getCall();
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [&](CC_EvCallCallLegModified const&)
    {
        observer.m_onLegRemoved = nullptr;
        call->deferred();
    };
    call->destroyParticipatingCallLegs();
    EXPECT_EQ(call->getNumberOfCallLegs(), 0u);
    EXPECT_EQ(bert.getCall(), nullptr);
    expectNothingLeft({&anna, &bert});
}

TEST_F(MovesAndEnds, ALegOnItsMoveGoesIntoNoCallThatEnds)
{
    RecordingCallObserver ofTheEnding("ending");
    RecordingCallObserver ofTheMove("move");
    CC_Call* const ending = CallControl::ACQUIRE_CALL("SWITCH");
    CC_Call* const other = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(ending->addCallObserver(&ofTheEnding), XCode::OK);
    ASSERT_EQ(other->addCallObserver(&ofTheMove), XCode::OK);
    XCode sent = XCode::OK;
    ofTheEnding.m_onEnded = [&](CC_EvCallObservationEnded const& event) { sent = event.getSource()->addCallLeg(*leg); };
    ofTheMove.m_onLegAdded = [&](CC_EvCallCallLegModified const&) { CallControl::RELEASE_CALL("SWITCH", ending); };
    EXPECT_EQ(other->addCallLeg(*leg), XCode::OK);
    EXPECT_EQ(sent, XCode::FAILURE);
    EXPECT_EQ(leg->getCall(), other);
    CallControl::RELEASE_CALL("SWITCH", other);
    leg->removeReference();
}

TEST_F(MovesAndEnds, AWaitingMoveIntoACallThatWasReleasedMeanwhileIsNotMade)
{
    RecordingCallObserver observer("observer");
    CC_Call* const first = CallControl::ACQUIRE_CALL("SWITCH");
    CC_Call* const second = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(first->addCallObserver(&observer), XCode::OK);
    observer.m_onLegAdded = [&](CC_EvCallCallLegModified const& event)
    {
        EXPECT_EQ(second->addCallLeg(*event.getCallLeg()), XCode::OK) << "waits";
        CallControl::RELEASE_CALL("SWITCH", second);
    };
    EXPECT_EQ(first->addCallLeg(*leg), XCode::OK);
    EXPECT_EQ(leg->getCall(), first);
    EXPECT_EQ(CC_Call::s_numberOfInstances, 1u);
    CallControl::RELEASE_CALL("SWITCH", first);
    leg->removeReference();
}

TEST_F(MovesAndEnds, WhoJoinsInsideTheNewsOfAJoiningLegHearsWhatThatLegChangesMeanwhile)
{
    RecordingCallObserver observer("observer");
    Party anna("anna"), bert("bert");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const joining = new CC_CallLeg;
    ASSERT_EQ(joining->setProperty(State(CC_PropertyId::STATE, State::CONNECTED)), XCode::OK);
    ASSERT_EQ(bert.adapter->accept(*call, {}), XCode::OK);
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegAdded = [&](CC_EvCallCallLegModified const&)
    {
        observer.m_onLegAdded = nullptr;
        EXPECT_EQ(anna.adapter->accept(*call, {}), XCode::OK);
        EXPECT_EQ(anna.peerState(), "CONNECTED");
        EXPECT_EQ(joining->setProperty(State(CC_PropertyId::STATE, State::RELEASED)), XCode::OK);
    };
    EXPECT_EQ(call->addCallLeg(*joining), XCode::OK);
    EXPECT_EQ(anna.peerState(), "TRYING") << "bert";
    settle();
    EXPECT_EQ(bert.peerState(), "TRYING") << "who was there before has missed it, and makes up for it";
    joining->removeReference();
    expectNothingLeft({&anna, &bert});
}

TEST_F(MovesAndEnds, AModuleThatReleasedItsLegItselfLeavesNoCallWhenTheOthersAreMovedAway)
{
    FakeRebootMgmt reboot;
    Party anna("anna"), bert("bert"), carl("carl"), dora("dora");
    connect(anna, bert);
    connect(carl, dora);
    ASSERT_EQ(anna.become(State::RELEASED), XCode::OK);
    settle();
    ASSERT_EQ(carl.adapter->transfer(*anna.adapter, false), XCode::OK);
    settle();
    for (Party* const party : {&anna, &bert, &carl, &dora})
        party->hangUp();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(MovesAndEnds, ADropHasTheCallLookedAtThoughTheLegWasReleasedBefore)
{
    Party anna("anna");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const live = new CC_CallLeg;
    ASSERT_EQ(live->setProperty(State(CC_PropertyId::STATE, State::CONNECTED)), XCode::OK);
    ASSERT_EQ(anna.adapter->accept(*call, {}), XCode::OK);
    ASSERT_EQ(call->addCallLeg(*live), XCode::OK);
    ASSERT_EQ(anna.become(State::RELEASED), XCode::OK);
    settle();
    EXPECT_EQ(call->getNumberOfCallLegs(), 2u) << "anna holds hers";
    anna.hangUp();
    settle();
    EXPECT_EQ(call->getNumberOfCallLegs(), 1u);
    CallControl::RELEASE_CALL("SWITCH", call);
    live->removeReference();
}

TEST_F(MovesAndEnds, ACallThatItsLastLegLeavesForAnotherIsGivenBack)
{
    FakeRebootMgmt reboot;
    CC_Call* const first = CallControl::ACQUIRE_CALL("SWITCH");
    CC_Call* const second = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(leg->setProperty(State(CC_PropertyId::STATE, State::CONNECTED)), XCode::OK);
    ASSERT_EQ(first->addCallLeg(*leg), XCode::OK);
    settle();
    ASSERT_EQ(second->addCallLeg(*leg), XCode::OK);
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 1u);
    EXPECT_EQ(CC_Call::TRANSFER_CALL_LEG(nullptr, *leg), XCode::OK);
    leg->removeReference();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}
