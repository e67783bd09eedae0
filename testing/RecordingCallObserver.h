#pragma once

#include "calls/CC_Call.h"
#include "calls/CC_CallObserver.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// Hears of a call: the lines "o: leg joined call", "o: leg left call", "o: call changed (Name)" and "o: call ended",
/// with the names of leg and call that the journal knows.
///
///     RecordingCallObserver observer("o");
///     observer.m_onLegRemoved = [](CC_EvCallCallLegModified const& event) { event.getSource()->defer(); };
///     std::ignore = call->addCallObserver(&observer);
class RecordingCallObserver : public CC_CallObserver, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingCallObserver() override;

    void onCallObservationEnded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegRemoved(CC_Event<CC_Call> const& event) override;
    void onCallPropertyChanged(CC_Event<CC_Call> const& event) override;

    /// These run inside the notification, after it has been recorded.
    Hook<void(CC_EvCallObservationEnded const&)> m_onEnded;
    Hook<void(CC_EvCallCallLegModified const&)> m_onLegAdded;
    Hook<void(CC_EvCallCallLegModified const&)> m_onLegRemoved;
    Hook<void(CC_EvCallPropertyChanged const&)> m_onChanged;
};
