#pragma once

#include "adapters/CC_CallAdapterObserver.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// What a module hears from its adapter: the lines "a: peer changed (Cause, State)" and "a: peer asked (Push Back: 5)",
/// and the sets of ids.
///
///     RecordingAdapterObserver observer("a");
///     observer.m_onPeerPropertyChange = [](CC_CallAdapter& adapter, CC_Flags const&) { adapter.drop(...); };
///     ...
///     EXPECT_EQ(observer.getFlagSets().back(), std::vector<unsigned int>{CC_PropertyId::STATE});
class RecordingAdapterObserver : public CC_CallAdapterObserver, public Recorder
{
public:
    using Ids = std::vector<unsigned int>;

    using Recorder::Recorder;
    ~RecordingAdapterObserver() override;

    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

    /// The ids of each property change, ascending, one set per notification.
    std::vector<Ids> const& getFlagSets() const { return m_flagSets; }
    /// The one-line texts of the services.
    Lines const& getServices() const { return m_services; }

    /// These run inside the notification, after it has been recorded.
    Hook<void(CC_CallAdapter&, CC_Flags const&)> m_onPeerPropertyChange;
    Hook<void(CC_CallAdapter&, CC_Service&)> m_onPeerSynchronousService;

private:
    std::vector<Ids> m_flagSets;
    Lines m_services;
};
