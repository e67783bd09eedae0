#include "testing/RecordingAdapterObserver.h"

#include "adapters/CC_CallAdapter.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyId.h"
#include "services/CC_ServicePushBack.h"

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
    EXPECT_EQ(observer.getServices(), Lines{"Push Back: 5"});
    EXPECT_EQ(observer.take(),
              (Lines{"a: peer changed (Cause, State)", "a: peer changed ()", "a: peer asked (Push Back: 5)"}));
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
