#pragma once

#include "callcontrol/provider/CC_Provider.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// Hears of the end of a provider: the line "o: provider destroyed".
///
///     RecordingProviderObserver observer("o");
///     std::ignore = observer.observe(provider);
class RecordingProviderObserver : public CC_Provider::Observer, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingProviderObserver() override; ///< stops observing

    /// Registers with the provider until either ends, and gives the result of that. Whoever registers the observer
    /// without this takes it out again without it, before the observer ends.
    XCode observe(CC_Provider& provider);

    void aboutDestroy(CC_Provider& provider) override;

    /// Runs inside the notification, after it has been recorded.
    Hook<void(CC_Provider&)> m_onDestroy;

private:
    std::vector<CC_Provider*> m_observed;
};
