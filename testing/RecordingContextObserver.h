#pragma once

#include "callcontrol/CC_Context.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// Hears of one context: the lines "o: SWITCH destroyed", "o: SWITCH provider sip added", "o: SWITCH provider sip
/// removed", "o: SWITCH call created" and "o: SWITCH call destroyed", the call under the name that the journal knows.
///
///     RecordingContextObserver observer("o");
///     std::ignore = CallControl::GET_CONTEXT("SWITCH")->addContextObserver(observer);
class RecordingContextObserver : public CC_Context::Observer, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingContextObserver() override;

    void aboutDestroy(CC_Context& context) override;
    void aboutAddProvider(CC_Context& context, String const& name) override;
    void aboutRemoveProvider(CC_Context& context, String const& name) override;
    void aboutCreateCall(CC_Context& context, CC_Call* call) override;
    void aboutDestroyCall(CC_Context& context, CC_Call* call) override;

    /// These run inside the notification, after it has been recorded.
    Hook<void(CC_Context&)> m_onDestroy;
    Hook<void(CC_Context&, String const&)> m_onAddProvider;
    Hook<void(CC_Context&, String const&)> m_onRemoveProvider;
    Hook<void(CC_Context&, CC_Call*)> m_onCreateCall;
    Hook<void(CC_Context&, CC_Call*)> m_onDestroyCall;

private:
    void recordOf(CC_Context const& context, std::string const& what);
};
