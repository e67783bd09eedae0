#pragma once

#include "adapters/CC_CallAdapterObserver.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// What a module hears from its adapter: the lines "a: peer changed (Cause, State)" and "a: peer asked (Push Back: 5)",
/// the sets of ids, and the values that the module would read inside the notification.
///
///     RecordingAdapterObserver observer("a");
///     observer.m_onPeerPropertyChange = [](CC_CallAdapter& adapter, CC_Flags const&) { adapter.drop(...); };
///     ...
///     EXPECT_EQ(observer.getFlagSets().back(), std::vector<unsigned int>{CC_PropertyId::STATE});
///     EXPECT_EQ(observer.getValues(), (Lines{"State: ALERTING", "State: CONNECTED"}));
class RecordingAdapterObserver : public CC_CallAdapterObserver, public Recorder
{
public:
    /// A set of property ids, ascending.
    using Ids = std::vector<unsigned int>;

    using Recorder::Recorder;
    ~RecordingAdapterObserver() override;

    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

    /// The ids of each property change, ascending, one set per notification.
    std::vector<Ids> const& getFlagSets() const { return m_flagSets; }
    /// The changed properties with the values that they had then, one line per notification: "Cause: absent, State:
    /// ALERTING, call's Context: 1". They are the peer's; the call's where only that has the property.
    Lines const& getValues() const { return m_values; }
    /// The one-line texts of the services.
    Lines const& getServices() const { return m_services; }

    /// These run inside the notification, after it has been recorded. @{
    Hook<void(CC_CallAdapter&, CC_Flags const&)> m_onPeerPropertyChange;
    Hook<void(CC_CallAdapter&, CC_Service&)> m_onPeerSynchronousService;
    /// @}

private:
    std::vector<Ids> m_flagSets;
    Lines m_values;
    Lines m_services;
};
