#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_Property.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeMediaContext.h"
#include "testing/FakeMediaContextRepository.h"
#include "testing/FakeTerminationRepository.h"
#include "testing/RecordingPropertyFactory.h"
#include "testing/RecordingProvider.h"
#include "testing/RecordingRegistryObserver.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <string_view>

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
    RecordingRegistryObserver observer("o");
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

namespace
{
// longer than what a String holds inside its own object
char const s_longContext[] = "a name of sixty octets, as a large site gives to its switches";
char const s_longProvider[] = "a name of sixty octets, as a large site gives to its trunks..";

/// Counts allocations while it lives, and lets the first fail.
struct NoMemory
{
    NoMemory() { FailingAllocator::failNth(1); }
    ~NoMemory() { FailingAllocator::stop(); }
    NoMemory(NoMemory const&) = delete;
    NoMemory& operator=(NoMemory const&) = delete;
};
} // namespace

TEST(CallControl_Static, LookingUpLongNamesTakesNoMemory)
{
    RecordingProvider provider("provider");
    ASSERT_TRUE(CallControl::CREATE_CONTEXT(s_longContext).isOk());
    ASSERT_TRUE(CallControl::ADD_PROVIDER(s_longContext, s_longProvider, provider).isOk());
    ASSERT_TRUE(CallControl::SET_NATIONAL_PREFIX(s_longContext, s_longProvider).isOk());
    InfoContainer info;
    std::string_view const view(s_longContext);
    CC_Context const* context = nullptr;
    CC_Provider const* found[5] = {};
    unsigned int numbers[4] = {};
    XCode set = XCode::FAILURE;
    XCode taken;
    {
        NoMemory const none;
        context = CallControl::GET_CONTEXT(s_longContext);
        found[0] = CallControl::GET_PROVIDER(s_longContext, s_longProvider);
        found[1] = CallControl::GET_PROVIDER(view, 0U);
        found[2] = CallControl::INSTANCE()->getProvider(view, s_longProvider);
        found[3] = CallControl::GET_PROVIDER(s_longContext, s_longContext);
        found[4] = CallControl::GET_PROVIDER(s_longProvider, s_longProvider);
        numbers[0] = CallControl::GET_NUMBER_OF_PROVIDERS(s_longContext);
        numbers[1] = static_cast<unsigned int>(CallControl::GET_NATIONAL_PREFIX(s_longContext).length());
        numbers[2] = CallControl::GET_NUMBER_OF_CALLS(s_longContext) + CallControl::GET_MAX_HOPS(s_longContext);
        numbers[3] = CallControl::GET_CALL_POOL(s_longContext) != nullptr ? 1 : 0;
        set = CallControl::SET_MAX_HOPS(s_longContext, 3);
        taken = CallControl::ADD_PROVIDER(s_longContext, s_longProvider, provider);
        CallControl::RELEASE_CALL(s_longContext, nullptr);
        CallControl::GET_CALL_INFO(info, s_longProvider, 9, 0, 9, 0, String::s_empty);
        CallControl::GET_PROVIDER_INFO(info, s_longContext, 0, 1, 0, 0, String::s_empty);
        CallControl::REMOVE_PROVIDER(s_longContext, s_longProvider);
        CallControl::REMOVE_PROVIDER(s_longContext, s_longProvider);
        EXPECT_EQ(FailingAllocator::count(), 1UL); // to tell that a name was removed which was not there
    }
    ASSERT_NE(context, nullptr);
    EXPECT_EQ(info.getNumberOfEntries(), 0u); // of no context, and of none that the level lets through
    CallControl::GET_PROVIDER_INFO(info, s_longContext, 0, 0, 0, 0, String::s_empty);
    EXPECT_EQ(info.getNumberOfEntries(), 1u);
    EXPECT_EQ(found[0], &provider);
    EXPECT_EQ(found[1], &provider);
    EXPECT_EQ(found[2], &provider);
    EXPECT_EQ(found[3], nullptr);
    EXPECT_EQ(found[4], nullptr);
    EXPECT_EQ(numbers[0], 1u);
    EXPECT_EQ(numbers[1], sizeof s_longProvider - 1);
    EXPECT_EQ(numbers[2], 0u);
    EXPECT_EQ(numbers[3], 1u);
    EXPECT_EQ(set, XCode::OK);
    EXPECT_EQ(taken, XCode::REFUSED);
    EXPECT_EQ(context->getMaxHops(), 3u);
    EXPECT_EQ(context->getNumberOfProviders(), 0u);
    CallControl::DESTROY_CONTEXT(s_longContext);
    EXPECT_EQ(CallControl::GET_CONTEXT(s_longContext), nullptr);
}

TEST(CallControl_Static, KeepingALongNameWithoutMemoryIsAResult)
{
    RecordingProvider provider("provider");
    ASSERT_TRUE(CallControl::CREATE_CONTEXT("lab").isOk());
    XCode results[4];
    {
        NoMemory const none;
        results[0] = CallControl::CREATE_CONTEXT(s_longContext);
        FailingAllocator::failNth(1);
        results[1] = CallControl::ADD_PROVIDER("lab", s_longProvider, provider);
        FailingAllocator::failNth(1);
        results[2] = CallControl::SET_NATIONAL_PREFIX("lab", s_longProvider);
        FailingAllocator::failNth(1);
        results[3] = CallControl::SET_INTERNATIONAL_PREFIX("lab", s_longProvider);
    }
    for (XCode const result : results)
        EXPECT_EQ(result, XCode::FAILURE);
    EXPECT_EQ(CallControl::GET_CONTEXT(s_longContext), nullptr);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_PROVIDERS("lab"), 0u);
    CallControl::DESTROY_CONTEXT("lab");
}

TEST(CallControl_Static, AContextOfALongNameEndsWithoutMemory)
{
    RecordingRegistryObserver observer("o");
    CallControl::REGISTER_CONTEXT_OBSERVER(observer);
    ASSERT_TRUE(CallControl::CREATE_CONTEXT(s_longContext).isOk());
    {
        NoMemory const none;
        CallControl::DESTROY_CONTEXT(s_longContext);
    }
    CallControl::UNREGISTER_CONTEXT_OBSERVER(observer);
    EXPECT_EQ(CallControl::GET_CONTEXT(s_longContext), nullptr);
    std::string const name = s_longContext;
    EXPECT_EQ(observer.take(), (Lines{"o: context " + name + " added", "o: context " + name + " destroyed"}));
}

TEST(CallControl_Static, AnEmptyNameOrNoneIsSwitch)
{
    ASSERT_TRUE(CallControl::CREATE_CONTEXT("SWITCH").isOk());
    CC_CallPool* const pool = CallControl::GET_CALL_POOL("SWITCH");
    char const* const null = nullptr;
    EXPECT_NE(pool, nullptr);
    EXPECT_EQ(CallControl::GET_CALL_POOL(""), pool);
    EXPECT_EQ(CallControl::GET_CALL_POOL(null), pool);
    EXPECT_EQ(CallControl::GET_CALL_POOL(std::string_view()), pool);
    EXPECT_EQ(CallControl::GET_CALL_POOL(String()), pool);
    EXPECT_EQ(CallControl::GET_CONTEXT(""), nullptr);
    CallControl::DESTROY_CONTEXT("SWITCH");
}
