// Sequences that a second reader of the code made up, each of which once left something dangling, stranded or looping.
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "properties/CC_Factory.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeRebootMgmt.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingCallObserver.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/PartyTest.h"

#include <gtest/gtest.h>
#include <new>

namespace
{
using Reentrancy = PartyTest;

TEST_F(Reentrancy, ACleanUpAskedForInsideTheEndOfTheCallLeavesNoLegBehind)
{
    RecordingCallObserver observer("observer");
    Party anna("anna");
    Party bert("bert");
    connect(anna, bert);
    CC_Call* const call = anna.getCall();
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [](CC_EvCallCallLegModified const& event) { event.getSource()->deferred(); };
    CallControl::RELEASE_CALL("SWITCH", call);
    EXPECT_EQ(anna.getCall(), nullptr);
    EXPECT_EQ(bert.getCall(), nullptr);
    expectNothingLeft({&anna, &bert});
}

TEST_F(Reentrancy, ACallThatMemoryKeptFromItsLegIsCleanedUpAllTheSame)
{
    // three observers of the leg come first; then there is no memory for the call's own registration
    RecordingCallObserver observer("observer");
    RecordingCallLegObserver first("first");
    RecordingCallLegObserver second("second");
    RecordingCallLegObserver third("third");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const leg = new CC_CallLeg;
    for (RecordingCallLegObserver* const guest : {&first, &second, &third})
        ASSERT_EQ(leg->addCallLegObserver(guest), XCode::OK);
    RecordingCallLegObserver fourth("fourth");
    ASSERT_EQ(leg->addCallLegObserver(&fourth), XCode::OK);
    FailingAllocator::failNth(1);
    XCode const added = call->addCallLeg(*leg);
    FailingAllocator::stop();
    EXPECT_EQ(added, XCode::OK);
    ASSERT_TRUE(FailingAllocator::hasFailed());
    ASSERT_EQ(leg->setProperty(State(CC_PropertyId::STATE, State::CONNECTED)), XCode::OK);
    settle();
    ASSERT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 1u);
    ASSERT_EQ(leg->setProperty(State(CC_PropertyId::STATE, State::RELEASED)), XCode::OK);
    leg->removeReference();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
}

TEST_F(Reentrancy, CallsMayBeDroppedByTheNameOfOneThatEndsMeanwhile)
{
    RecordingCallObserver observer("observer");
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    Party dora("dora");
    connect(anna, bert);
    connect(carl, dora);
    CC_Call* const call = anna.getCall();
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [](CC_EvCallCallLegModified const& event)
    { CallControl::RELEASE_CALL("SWITCH", event.getSource()); };
    CallControl::GET_CALL_POOL("SWITCH")->dropCalls(String::s_empty, call->getName());
    EXPECT_EQ(anna.getCall(), nullptr);
    EXPECT_NE(carl.getCall(), nullptr) << "the other call has another name";
    expectNothingLeft({&anna, &bert, &carl, &dora});
}

TEST_F(Reentrancy, AnObserverThatPutsLegsBackKeepsNeitherDropCallsNorATransferForEver)
{
    RecordingCallObserver observer("observer");
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    Party dora("dora");
    connect(anna, bert);
    connect(carl, dora);
    CC_Call* const call = anna.getCall();
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [call](CC_EvCallCallLegModified const& event)
    { std::ignore = call->addCallLeg(*event.getCallLeg()); };
    CallControl::GET_CALL_POOL("SWITCH")->dropCalls(String::s_empty, call->getName());
    EXPECT_EQ(call->getNumberOfCallLegs(), 2u);
    std::ignore = carl.adapter->transfer(*anna.adapter, false);
    call->removeCallObserver(&observer);
    expectNothingLeft({&anna, &bert, &carl, &dora});
}

TEST_F(Reentrancy, WhatTheLastCallSaidIsForgottenAlsoWhenTheEndingLegCleansUp)
{
    RecordingCallLegObserver guest("guest");
    Party anna("anna");
    Party bert("bert");
    connect(anna, bert);
    ASSERT_EQ(anna.say(CC_PropertyId::DISPLAY, "old"), XCode::OK);
    CC_CallLeg& leg = *anna.getCall()->getCallLeg(0);
    anna.getCall()->removeCallLeg(leg); // the adapter's reference is now the only one
    ASSERT_EQ(leg.addCallLegObserver(&guest), XCode::OK);
    guest.m_onEnded = [&anna](CC_EvCallLegObservationEnded const&) { anna.adapter->cleanup(); };
    settle();
    anna.hangUp();
    EXPECT_EQ(anna.adapter->getOwnProperty(CC_PropertyId::DISPLAY), nullptr);
    anna.setup();
    EXPECT_EQ(anna.dial(bert), XCode::FAILURE) << "bert is still in the first call";
    expectNothingLeft({&anna, &bert});
}

TEST_F(Reentrancy, ALegThatEndsGoesIntoNoCall)
{
    RecordingCallLegObserver guest("guest");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(leg->addCallLegObserver(&guest), XCode::OK);
    XCode added = XCode::OK;
    guest.m_onEnded = [&](CC_Event<CC_CallLeg> const& event) { added = call->addCallLeg(*event.getSource()); };
    leg->removeReference();
    EXPECT_EQ(added, XCode::FAILURE);
    EXPECT_EQ(call->getNumberOfCallLegs(), 0u);
    CallControl::RELEASE_CALL("SWITCH", call);
}

TEST_F(Reentrancy, WhoHearsOfALegThatSetupOrCleanupEndsCannotBeginAnother)
{
    RecordingCallLegObserver guest("guest");
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    std::vector<XCode> results;
    guest.m_onChanged = [&](CC_Event<CC_CallLeg> const& event)
    {
        if (event.getSource()->getState() != State::RELEASED)
            return;
        anna.hangUp();
        results.push_back(anna.dial(carl));
    };
    for (bool const isSetup : {true, false})
    {
        connect(anna, bert);
        ASSERT_EQ(anna.getCall()->getCallLeg(0)->addCallLegObserver(&guest), XCode::OK);
        isSetup ? anna.setup() : anna.adapter->cleanup();
        EXPECT_EQ(anna.getCall(), nullptr);
        EXPECT_FALSE(results.empty());
        for (XCode const result : results)
            EXPECT_EQ(result, XCode::REFUSED);
        results.clear();
        bert.hangUp();
        settle();
    }
    expectNothingLeft({&anna, &bert, &carl});
}

TEST_F(Reentrancy, AProviderThatEmptiesTheCallAndRefusesItStrandsNothing)
{
    FakeRebootMgmt reboot;
    Party anna("anna");
    Party bert("bert");
    bert.provider.m_dial = [](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
    {
        call.destroyParticipatingCallLegs();
        return XCode::FAILURE;
    };
    EXPECT_EQ(anna.dial(bert), XCode::FAILURE);
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(Reentrancy, ACallThatIsReleasedAsTheLegJoinsIsNotOffered)
{
    class Releaser : public CC_Context::Observer
    {
    public:
        void aboutDestroy(CC_Context&) override {}
        void aboutAddProvider(CC_Context&, String const&) override {}
        void aboutRemoveProvider(CC_Context&, String const&) override {}
        void aboutCreateCall(CC_Context&, CC_Call* call) override { std::ignore = call->addCallObserver(&observer); }
        void aboutDestroyCall(CC_Context&, CC_Call*) override {}
        RecordingCallObserver observer{"observer"};
    };
    Releaser releaser;
    releaser.observer.m_onLegAdded = [](CC_EvCallCallLegModified const& event)
    { CallControl::RELEASE_CALL("SWITCH", event.getSource()); };
    ASSERT_EQ(CallControl::GET_CONTEXT("SWITCH")->addContextObserver(releaser), XCode::OK);
    Party anna("anna");
    Party bert("bert");
    EXPECT_EQ(anna.dial(bert), XCode::FAILURE);
    EXPECT_TRUE(bert.provider.take().empty());
    CallControl::GET_CONTEXT("SWITCH")->removeContextObserver(releaser);
    expectNothingLeft({&anna, &bert});
}

TEST_F(Reentrancy, AFilterThatRunsOutOfMemoryIsAFilterThatFails)
{
    RecordingPropertyFilter filter("filter");
    bool isThrowing = false;
    filter.onApply(
        [&isThrowing](CC_PropertyContainer&) -> XCode
        {
            if (isThrowing)
                throw std::bad_alloc();
            return XCode::OK;
        });
    CC_PropertyFilterContainer filters;
    ASSERT_EQ(filters.addFilter(filter), XCode::OK);
    Party anna("anna");
    Party bert("bert", "", nullptr, nullptr, &filters);
    Party carl("carl", "", nullptr, &filters, &filters);
    connect(anna, bert);
    isThrowing = true;
    EXPECT_EQ(anna.say(CC_PropertyId::DISPLAY, "x"), XCode::OK);
    EXPECT_EQ(bert.peerText(CC_PropertyId::DISPLAY), "x") << "what the filters leave is shown";
    bert.getCall()->removeCallLeg(*bert.getCall()->getCallLeg(1));
    EXPECT_EQ(carl.dial(anna), XCode::FAILURE) << "input filters must succeed";
    anna.adapter.reset();
    settle();
    expectNothingLeft({&anna, &bert, &carl});
}

TEST(FactoryWithoutMemory, AListOfIdsThatMemoryCutsShortRegistersNothingAndIsRemovedWhole)
{
    CallControl::INSTANCE(); // its making is not what is tried here
    CC_Factory factory;
    for (unsigned long n = 1;; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const added = CallControl::ADD_PROPERTY_FACTORY(&factory);
        FailingAllocator::stop();
        if (!FailingAllocator::hasFailed())
        {
            EXPECT_EQ(added, XCode::OK);
            break;
        }
        EXPECT_EQ(added, XCode::FAILURE) << "allocation " << n;
        EXPECT_EQ(CallControl::CREATE_PROPERTY(CC_PropertyId::NETWORK), nullptr);
    }
    FailingAllocator::failNth(1);
    CallControl::REMOVE_PROPERTY_FACTORY(&factory);
    FailingAllocator::stop();
    EXPECT_TRUE(FailingAllocator::hasFailed());
    EXPECT_EQ(CallControl::CREATE_PROPERTY(CC_PropertyId::NETWORK), nullptr);
    EXPECT_EQ(CallControl::CREATE_PROPERTY(CC_PropertyId::STATE), nullptr);
}
} // namespace
