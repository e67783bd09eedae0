#include "testing/RecordingAdapterObserver.h"

#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_ServicePushBack.h"
#include "testing/CallControlFixture.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingProvider.h"

#include <gtest/gtest.h>
#include <memory>

TEST(RecordingAdapterObserver, KeepsSetsOfIdsAndTextsOfServices)
{
    CC_CallAdapter adapter;
    RecordingAdapterObserver observer("a");
    CC_Flags flags;
    EXPECT_TRUE(flags.set(CC_PropertyId::STATE, true).isOk());
    EXPECT_TRUE(flags.set(CC_PropertyId::CAUSE, true).isOk());
    CC_ServicePushBack pushBack(5);
    observer.notifyPeerPropertyChange(adapter, flags);
    observer.notifyPeerPropertyChange(adapter, CC_Flags());
    observer.notifyPeerSynchronousService(adapter, pushBack);
    using Ids = RecordingAdapterObserver::Ids;
    EXPECT_EQ(observer.getFlagSets(), (std::vector<Ids>{{CC_PropertyId::CAUSE, CC_PropertyId::STATE}, {}}));
    EXPECT_EQ(observer.getValues(), (Lines{"Cause: absent, State: absent", ""}));
    EXPECT_EQ(observer.getServices(), Lines{"Push Back: 5"});
    EXPECT_EQ(observer.take(),
              (Lines{"a: peer changed (Cause, State)", "a: peer changed ()", "a: peer asked (Push Back: 5)"}));
}

TEST(RecordingAdapterObserver, KeepsTheValuesThatTheModuleWouldHaveRead)
{
    using State = CC_PropertyCallLegState;
    CallControlFixture callControl;
    RecordingProvider isdn("isdn");
    RecordingEndpoint line("line");
    RecordingEndpoint other("other", "other network");
    RecordingAdapterObserver observer("a");
    CC_CallAdapter caller;
    CC_CallAdapter called;
    auto const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(CallControl::ADD_PROVIDER("SWITCH", "isdn", isdn), XCode::OK);
    isdn.m_dial = [&](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
    { return called.accept(call, none); };
    EXPECT_EQ(caller.setup("1", line, &observer), XCode::OK);
    EXPECT_EQ(called.setup("2", other, nullptr), XCode::OK);
    EXPECT_EQ(caller.dial("SWITCH", "isdn", "4989123", none, none, none, nullptr), XCode::OK);
    callControl.settle();
    EXPECT_EQ(called.setOwnProperty(State(CC_PropertyId::STATE, State::ALERTING)), XCode::OK);
    EXPECT_EQ(called.setOwnProperty(CC_PropertyString(CC_PropertyId::DISPLAY, "hello")), XCode::OK);
    callControl.settle();
    EXPECT_EQ(called.setCallProperty(CC_PropertyString(CC_PropertyId::URI, "sip:x")), XCode::OK);
    callControl.settle();
    called.drop(QCause::USER_BUSY, 0);
    callControl.settle();
    called.cleanup();
    caller.cleanup();
    CallControl::REMOVE_PROVIDER("SWITCH", "isdn");
    ASSERT_EQ(observer.getValues().size(), 4u);
    EXPECT_EQ(observer.getValues()[1], "Display: hello, State: ALERTING");
    EXPECT_EQ(observer.getValues()[2], "call's URI: sip:x");
    EXPECT_EQ(observer.getValues()[3], "Cause: User busy, State: RELEASED");
}

TEST(RecordingAdapterObserver, AHookMayDestroyAdapterAndObserver)
{
    auto adapter = std::make_unique<CC_CallAdapter>();
    auto observer = std::make_unique<RecordingAdapterObserver>("a");
    observer->m_onPeerPropertyChange = [&](CC_CallAdapter& told, CC_Flags const&)
    {
        EXPECT_EQ(&told, adapter.get());
        adapter.reset();
        observer.reset();
    };
    observer->notifyPeerPropertyChange(*adapter, CC_Flags());
    EXPECT_EQ(observer, nullptr);
}

TEST(RecordingAdapterObserver, AHookSeesTheService)
{
    CC_CallAdapter adapter;
    RecordingAdapterObserver observer("a");
    CC_Service const* seen = nullptr;
    observer.m_onPeerSynchronousService = [&](CC_CallAdapter&, CC_Service& service) { seen = &service; };
    CC_ServicePushBack pushBack(5);
    observer.notifyPeerSynchronousService(adapter, pushBack);
    EXPECT_EQ(seen, &pushBack);
}
