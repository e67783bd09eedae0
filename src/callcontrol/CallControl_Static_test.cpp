#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_Property.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"
#include "testing/FakeMediaContext.h"
#include "testing/FakeMediaContextRepository.h"
#include "testing/FakeTerminationRepository.h"
#include "testing/RecordingContextsObserver.h"
#include "testing/RecordingPropertyFactory.h"
#include "testing/RecordingProvider.h"

#include <gtest/gtest.h>
#include <memory>

TEST(CallControl_Static, TheEnvironmentIsThatOfTheOneObject)
{
    CallControl& one = *CallControl::INSTANCE();
    TYEventLoop* const ccBefore = CallControl::GET_CC_EVENT_LOOP();
    TYEventLoop cc;
    TYEventLoop dp;
    CallControl::SET_CC_EVENT_LOOP(&cc);
    CallControl::SET_DP_EVENT_LOOP(&dp);
    EXPECT_EQ(one.getCcEventLoop(), &cc);
    EXPECT_EQ(one.getDpEventLoop(), &dp);
    EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), &cc);
    EXPECT_EQ(CallControl::GET_DP_EVENT_LOOP(), &dp);
    EXPECT_EQ(&CallControl::GET_CC_SYNC_EVENT(EventPrio::LOW), &cc.getSyncEvent(EventPrio::LOW));
    EXPECT_EQ(&CallControl::GET_DP_SYNC_EVENT(EventPrio::HIGHEST), &dp.getSyncEvent(EventPrio::HIGHEST));
    CallControl::SET_CC_EVENT_LOOP(ccBefore);
    CallControl::SET_DP_EVENT_LOOP(nullptr);
    {
        FakeMediaContextRepository contexts; // sets itself
        FakeTerminationRepository terminations;
        EXPECT_EQ(one.getMgContextRepository(), &contexts);
        EXPECT_EQ(CallControl::GET_MG_CONTEXT_REPOSITORY(), &contexts);
        EXPECT_EQ(one.getMgTerminationRepository(), &terminations);
        EXPECT_EQ(CallControl::GET_MG_TERMINATION_REPOSITORY(), &terminations);
        CallControl::SET_MG_CONTEXT_REPOSITORY(nullptr);
        CallControl::SET_MG_TERMINATION_REPOSITORY(nullptr);
        EXPECT_EQ(one.getMgContextRepository(), nullptr);
        EXPECT_EQ(one.getMgTerminationRepository(), nullptr);
    }
}

TEST(CallControl_Static, FactoriesAreThoseOfTheOneObject)
{
    RecordingPropertyFactory factory("f", {CC_PropertyId::URI});
    EXPECT_EQ(CallControl::ADD_PROPERTY_FACTORY(&factory), XCode::OK);
    EXPECT_EQ(CallControl::ADD_PROPERTY_FACTORY(&factory), XCode::REFUSED);
    std::unique_ptr<CC_Property> const property(CallControl::CREATE_PROPERTY(CC_PropertyId::URI));
    EXPECT_NE(property, nullptr);
    CallControl::REMOVE_PROPERTY_FACTORY(&factory);
    EXPECT_EQ(CallControl::CREATE_PROPERTY(CC_PropertyId::URI), nullptr);
}

TEST(CallControl_Static, ContextsAndTheirObserversAreThoseOfTheOneObject)
{
    RecordingContextsObserver observer("o");
    CallControl::REGISTER_CONTEXT_OBSERVER(observer);
    EXPECT_EQ(CallControl::CREATE_CONTEXT("lab"), XCode::OK);
    EXPECT_EQ(CallControl::CREATE_CONTEXT("lab"), XCode::REFUSED);
    EXPECT_NE(CallControl::GET_CONTEXT("lab"), nullptr);
    EXPECT_EQ(CallControl::GET_CONTEXT("lab"), CallControl::INSTANCE()->getContext("lab"));
    CallControl::DESTROY_CONTEXT("lab");
    EXPECT_EQ(CallControl::GET_CONTEXT("lab"), nullptr);
    CallControl::UNREGISTER_CONTEXT_OBSERVER(observer);
    CallControl::DESTROY_CONTEXT("lab");
    EXPECT_EQ(observer.take(), (Lines{"o: context lab added", "o: context lab destroyed"}));
}

TEST(CallControl_Static, OperationsOnAContextReachIt)
{
    DrivenLoop loop;
    RecordingProvider provider("provider");
    ASSERT_TRUE(CallControl::CREATE_CONTEXT("lab").isOk());
    CC_Context& lab = *CallControl::GET_CONTEXT("lab");

    EXPECT_EQ(CallControl::SET_NATIONAL_PREFIX("lab", "0"), XCode::OK);
    EXPECT_EQ(CallControl::SET_INTERNATIONAL_PREFIX("lab", "00"), XCode::OK);
    EXPECT_EQ(CallControl::SET_MAX_HOPS("lab", 7), XCode::OK);
    EXPECT_EQ(&CallControl::GET_NATIONAL_PREFIX("lab"), &lab.getNationalPrefix());
    EXPECT_EQ(&CallControl::GET_INTERNATIONAL_PREFIX("lab"), &lab.getInternationalPrefix());
    EXPECT_EQ(CallControl::GET_NATIONAL_PREFIX("lab"), "0");
    EXPECT_EQ(CallControl::GET_INTERNATIONAL_PREFIX("lab"), "00");
    EXPECT_EQ(CallControl::GET_MAX_HOPS("lab"), 7u);

    EXPECT_EQ(CallControl::ADD_PROVIDER("lab", "isdn", provider), XCode::OK);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_PROVIDERS("lab"), 1u);
    EXPECT_EQ(CallControl::GET_PROVIDER("lab", 0u), &provider);
    EXPECT_EQ(CallControl::GET_PROVIDER("lab", "isdn"), &provider);
    InfoContainer info;
    EXPECT_EQ(&CallControl::GET_PROVIDER_INFO(info, "lab", 9, 1, 9, 2, "My "), &info);
    ASSERT_EQ(info.getNumberOfEntries(), 3u);
    EXPECT_EQ(info.getEntry(0).level, 1u);
    EXPECT_EQ(info.getEntry(0).detail, 2u);
    EXPECT_EQ(info.getEntry(0).key, "My Call Control");
    EXPECT_EQ(info.getEntry(2).key, "isdn");
    CallControl::REMOVE_PROVIDER("lab", "isdn");
    EXPECT_EQ(CallControl::GET_NUMBER_OF_PROVIDERS("lab"), 0u);

    TYPtr<MG_IContext> const media(new FakeMediaContext(7));
    EXPECT_EQ(CallControl::GET_CALL_POOL("lab"), lab.getCallPool());
    CC_Call* const first = CallControl::ACQUIRE_CALL("lab");
    CC_Call* const second = CallControl::ACQUIRE_CALL("lab", media.get());
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 2u);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("lab"), 2u);
    EXPECT_EQ(CallControl::GET_CALL("lab", 0), first);
    EXPECT_EQ(CallControl::GET_CALL("lab", 1), second);
    InfoContainer calls;
    EXPECT_EQ(&CallControl::GET_CALL_INFO(calls, "lab", 4, 3, 6, 5, "My "), &calls);
    ASSERT_GE(calls.getNumberOfEntries(), 2u);
    EXPECT_EQ(calls.getEntry(0).level, 3u);
    EXPECT_EQ(calls.getEntry(0).detail, 5u);
    EXPECT_EQ(calls.getEntry(0).key, "My Call Control");
    EXPECT_EQ(calls.getEntry(1).level, 4u);
    EXPECT_EQ(calls.getEntry(1).key, "Call Pool");
    CallControl::RELEASE_CALL("lab", first);
    CallControl::RELEASE_CALL("lab", second);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("lab"), 0u);
    CallControl::DESTROY_CONTEXT("lab");
}

TEST(CallControl_Static, TheDefaultContextIsSwitch) { EXPECT_STREQ(CallControl::DEFAULT_CONTEXT_NAME, "SWITCH"); }
