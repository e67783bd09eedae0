// The recorders of calls, legs, contexts, providers and endpoints: each notification, its line and its hook.
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_ServicePushBack.h"
#include "testing/CallControlFixture.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingCallObserver.h"
#include "testing/RecordingContextObserver.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingEndpointObserver.h"
#include "testing/RecordingProvider.h"
#include "testing/RecordingProviderObserver.h"
#include "testing/RecordingRegistryObserver.h"

#include <gtest/gtest.h>
#include <optional>
#include <typeinfo>

namespace
{
struct RecordingObservers : testing::Test, CallControlFixture
{
    Journal m_journal;
};
} // namespace

TEST_F(RecordingObservers, ACallAndItsLegAreRecordedInOneOrder)
{
    RecordingCallObserver calls("c", &m_journal);
    RecordingCallLegObserver legs("l", &m_journal);
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_TRUE(leg->setName("L").isOk());
    m_journal.name(call, "X");
    EXPECT_TRUE(call->addCallObserver(&calls).isOk());
    EXPECT_TRUE(call->addCallLegObserver(&legs).isOk());
    int hooks = 0;
    calls.m_onLegAdded = [&](auto const&) { ++hooks; };
    calls.m_onLegRemoved = [&](auto const&) { ++hooks; };
    calls.m_onChanged = [&](auto const&) { ++hooks; };
    calls.m_onEnded = [&](auto const&) { ++hooks; };
    legs.m_onRelinked = [&](auto const&) { ++hooks; };
    legs.m_onChanged = [&](auto const&) { ++hooks; };
    legs.m_onService = [&](auto const&) { ++hooks; };
    EXPECT_TRUE(call->addCallLeg(*leg).isOk());
    EXPECT_TRUE(call->setProperty(CC_PropertyString(CC_PropertyId::NAME, "n")).isOk());
    EXPECT_TRUE(leg->setProperty(CC_PropertyString(CC_PropertyId::NAME, "n")).isOk());
    CC_ServicePushBack pushBack(5);
    leg->invokeSynchronousService(pushBack);
    call->removeCallLeg(*leg);
    settle();
    EXPECT_EQ(m_journal.take(),
              (Lines{"c: L joined X", "l: L moved from none to X", "c: X changed (Name)", "l: L changed (Name)",
                     "l: L asked (Push Back: 5)", "c: L left X", "c: X ended"}));
    EXPECT_EQ(hooks, 7);
    leg->removeReference();
}

TEST_F(RecordingObservers, ALegsEndIsRecorded)
{
    RecordingCallLegObserver legs("l", &m_journal);
    bool wasRun = false;
    legs.m_onEnded = [&](auto const&) { wasRun = true; };
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_TRUE(leg->addCallLegObserver(&legs).isOk());
    leg->removeReference();
    EXPECT_EQ(m_journal.take(), Lines{"l: leg ended"});
    EXPECT_TRUE(wasRun);
}

TEST_F(RecordingObservers, AWrongEventIsFatalAsItIsForEveryObserver)
{
    RecordingCallObserver calls("c", &m_journal);
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    CC_EvCallObservationEnded const wrong(*call);
    EXPECT_THROW(calls.onCallPropertyChanged(wrong), std::bad_cast);
    EXPECT_EQ(m_journal.take(), Lines());
    CallControl::RELEASE_CALL("SWITCH", call);
}

TEST_F(RecordingObservers, AContextIsRecorded)
{
    RecordingContextObserver context("o", &m_journal);
    RecordingRegistryObserver contexts("all", &m_journal);
    RecordingProvider provider("p", &m_journal);
    CallControl::REGISTER_CONTEXT_OBSERVER(contexts);
    int hooks = 0;
    contexts.m_onAdded = [&](String const&) { ++hooks; };
    contexts.m_onDestroyed = [&](String const&) { ++hooks; };
    context.m_onAddProvider = [&](CC_Context&, String const&) { ++hooks; };
    context.m_onRemoveProvider = [&](CC_Context&, String const&) { ++hooks; };
    context.m_onCreateCall = [&](CC_Context&, CC_Call*) { ++hooks; };
    context.m_onDestroyCall = [&](CC_Context&, CC_Call*) { ++hooks; };
    context.m_onDestroy = [&](CC_Context&) { ++hooks; };
    EXPECT_TRUE(CallControl::CREATE_CONTEXT("other").isOk());
    EXPECT_TRUE(CallControl::GET_CONTEXT("other")->addContextObserver(context).isOk());
    EXPECT_TRUE(CallControl::ADD_PROVIDER("other", "sip", provider).isOk());
    CallControl::RELEASE_CALL("other", CallControl::ACQUIRE_CALL("other"));
    CallControl::REMOVE_PROVIDER("other", "sip");
    CallControl::DESTROY_CONTEXT("other");
    EXPECT_EQ(m_journal.take(),
              (Lines{"all: context other added", "o: other provider sip added", "o: other call created",
                     "o: other call destroyed", "o: other provider sip removed", "all: context other destroyed",
                     "o: other destroyed"}));
    EXPECT_EQ(hooks, 7);
}

TEST_F(RecordingObservers, OneThatEndsFirstIsToldNothingMore)
{
    RecordingProvider provider("p");
    RecordingEndpoint endpoint("e");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    CC_CallLeg* const leg = new CC_CallLeg;
    {
        RecordingContextObserver ofContext("context", &m_journal);
        RecordingRegistryObserver ofRegistry("registry", &m_journal);
        RecordingCallObserver ofCall("call", &m_journal);
        RecordingCallLegObserver ofLeg("leg", &m_journal);
        RecordingProviderObserver ofProvider("provider", &m_journal);
        RecordingEndpointObserver ofEndpoint("endpoint", &m_journal);
        EXPECT_EQ(ofContext.observe(*getContext()), XCode::OK);
        CallControl::REGISTER_CONTEXT_OBSERVER(ofRegistry);
        EXPECT_EQ(ofCall.observe(*call), XCode::OK);
        EXPECT_EQ(ofLeg.observe(*leg), XCode::OK);
        EXPECT_EQ(ofProvider.observe(provider), XCode::OK);
        EXPECT_EQ(ofEndpoint.observe(endpoint), XCode::OK);
        EXPECT_EQ(call->addCallLeg(*leg), XCode::OK);
        EXPECT_EQ(CallControl::ADD_PROVIDER("SWITCH", "p", provider), XCode::OK);
        EXPECT_EQ(m_journal.take(), (Lines{"call: leg joined call", "leg: leg moved from none to call",
                                           "context: SWITCH provider p added"}));
    }
    CallControl::REMOVE_PROVIDER("SWITCH", "p");
    call->removeCallLeg(*leg);
    leg->removeReference();
    CallControl::DESTROY_CONTEXT("SWITCH");
    EXPECT_EQ(m_journal.take(), Lines());
}

TEST_F(RecordingObservers, OneThatEndsLastTouchesNothingMore)
{
    std::optional<RecordingProvider> provider(std::in_place, "p");
    std::optional<RecordingEndpoint> endpoint(std::in_place, "e");
    RecordingContextObserver ofContext("context", &m_journal);
    RecordingCallObserver ofCall("call", &m_journal);
    RecordingCallLegObserver ofLeg("leg", &m_journal);
    RecordingProviderObserver ofProvider("provider", &m_journal);
    RecordingEndpointObserver ofEndpoint("endpoint", &m_journal);
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(ofCall.observe(*call), XCode::OK);
    EXPECT_EQ(ofLeg.observe(*leg), XCode::OK);
    EXPECT_EQ(ofProvider.observe(*provider), XCode::OK);
    EXPECT_EQ(ofEndpoint.observe(*endpoint), XCode::OK);
    EXPECT_EQ(ofContext.observe(*getContext()), XCode::OK);
    leg->removeReference();
    provider.reset();
    endpoint.reset();
    CallControl::RELEASE_CALL("SWITCH", call);
    CallControl::DESTROY_CONTEXT("SWITCH");
    EXPECT_EQ(m_journal.take(),
              (Lines{"leg: leg ended", "provider: provider destroyed", "endpoint: endpoint destroyed",
                     "context: SWITCH call destroyed", "call: call ended", "context: SWITCH destroyed"}));
}

TEST_F(RecordingObservers, TheEndsOfProvidersAndEndpointsAreRecorded)
{
    RecordingProviderObserver providers("p", &m_journal);
    RecordingEndpointObserver endpoints("e", &m_journal);
    std::optional<RecordingProvider> provider(std::in_place, "isdn", &m_journal);
    std::optional<RecordingEndpoint> endpoint(std::in_place, "line", "pstn", &m_journal);
    EXPECT_TRUE(provider->addProviderObserver(providers).isOk());
    EXPECT_TRUE(endpoint->addEndpointObserver(endpoints).isOk());
    int hooks = 0;
    providers.m_onDestroy = [&](CC_Provider&) { ++hooks; };
    endpoints.m_onFinished = [&](CC_Endpoint&) { ++hooks; };
    endpoints.m_onDestroy = [&](CC_Endpoint&) { ++hooks; };
    CC_Endpoint::NOTIFY_OBSERVER_ABOUT_FINISHED(endpoints, *endpoint, nullptr);
    provider.reset();
    endpoint.reset();
    EXPECT_EQ(m_journal.take(), (Lines{"e: endpoint finished", "p: provider destroyed", "e: endpoint destroyed"}));
    EXPECT_EQ(hooks, 3);
}
