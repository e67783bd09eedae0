#pragma once

#include "callcontrol/CC_Context.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// Hears of one context: the lines "o: SWITCH destroyed", "o: SWITCH provider sip added", "o: SWITCH provider sip
/// removed", "o: SWITCH call created" and "o: SWITCH call destroyed", the call under the name that the journal knows.
///
///     RecordingContextObserver observer("o");
///     std::ignore = observer.observe(*CallControl::GET_CONTEXT("SWITCH"));
class RecordingContextObserver : public CC_Context::Observer, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingContextObserver() override; ///< stops observing

    /// Registers with the context until either ends, and gives the result of that. Whoever registers the observer
    /// without this takes it out again without it, before the observer ends.
    XCode observe(CC_Context& context);

    void aboutDestroy(CC_Context& context) override;
    void aboutAddProvider(CC_Context& context, String const& name) override;
    void aboutRemoveProvider(CC_Context& context, String const& name) override;
    void aboutCreateCall(CC_Context& context, CC_Call* call) override;
    void aboutDestroyCall(CC_Context& context, CC_Call* call) override;

    /// These run inside the notification, after it has been recorded. @{
    Hook<void(CC_Context&)> m_onDestroy;
    Hook<void(CC_Context&, String const&)> m_onAddProvider;
    Hook<void(CC_Context&, String const&)> m_onRemoveProvider;
    Hook<void(CC_Context&, CC_Call*)> m_onCreateCall;
    Hook<void(CC_Context&, CC_Call*)> m_onDestroyCall;
    /// @}

private:
    void recordOf(CC_Context const& context, std::string const& what);

    std::vector<CC_Context*> m_observed;
};
