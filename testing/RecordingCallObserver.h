#pragma once

#include "calls/CC_Call.h"
#include "calls/CC_CallObserver.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// Hears of a call: the lines "o: leg joined call", "o: leg left call", "o: call changed (Name)" and "o: call ended",
/// with the names of leg and call that the journal knows.
///
///     RecordingCallObserver observer("o");
///     observer.m_onLegRemoved = [](CC_EvCallCallLegModified const& event) { event.getSource()->defer(); };
///     std::ignore = observer.observe(*call);
class RecordingCallObserver : public CC_CallObserver, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingCallObserver() override; ///< stops observing

    /// Registers with the call until either ends, and gives the result of that. Whoever registers the observer without
    /// this takes it out again without it, before the observer ends.
    XCode observe(CC_Call& call);

    void onCallObservationEnded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegRemoved(CC_Event<CC_Call> const& event) override;
    void onCallPropertyChanged(CC_Event<CC_Call> const& event) override;

    /// These run inside the notification, after it has been recorded. @{
    Hook<void(CC_EvCallObservationEnded const&)> m_onEnded;
    Hook<void(CC_EvCallCallLegModified const&)> m_onLegAdded;
    Hook<void(CC_EvCallCallLegModified const&)> m_onLegRemoved;
    Hook<void(CC_EvCallPropertyChanged const&)> m_onChanged;
    /// @}

private:
    std::vector<CC_Call*> m_observed;
};
