#pragma once

#include "callcontrol/CallControl.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// Hears of the contexts that come and go: the lines "o: context SWITCH added" and "o: context SWITCH destroyed".
///
///     RecordingRegistryObserver observer("o");
///     CallControl::REGISTER_CONTEXT_OBSERVER(observer); // at the latest its end takes it out
class RecordingRegistryObserver : public CallControl::ContextObserver, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingRegistryObserver() override;

    void contextAdded(String const& name) override;
    void contextDestroyed(String const& name) override;

    /// These run inside the notification, after it has been recorded. @{
    Hook<void(String const&)> m_onAdded;
    Hook<void(String const&)> m_onDestroyed;
    /// @}
};
