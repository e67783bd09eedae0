#pragma once

#include "calls/CC_CallLeg.h"
#include "calls/CC_CallLegObserver.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// Hears of call legs: the lines "o: leg moved from X to none", "o: leg changed (Cause, State)",
/// "o: leg asked (Push Back: 5)" and "o: leg ended", with the names of leg and calls that the journal knows.
///
///     RecordingCallLegObserver observer("o");
///     std::ignore = observer.observe(*leg);
class RecordingCallLegObserver : public CC_CallLegObserver, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingCallLegObserver() override; ///< stops observing

    /// Registers with the leg until either ends, and gives the result of that. Whoever registers the observer without
    /// this takes it out again without it, before the observer ends.
    XCode observe(CC_CallLeg& leg);

    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) override;

    /// These run inside the notification, after it has been recorded. @{
    Hook<void(CC_EvCallLegObservationEnded const&)> m_onEnded;
    Hook<void(CC_EvCallLegCallRelinked const&)> m_onRelinked;
    Hook<void(CC_EvCallLegPropertyChanged const&)> m_onChanged;
    Hook<void(CC_EvCallLegSynchronousService const&)> m_onService;
    /// @}

private:
    std::vector<CC_CallLeg*> m_observed;
};
