#pragma once

#include "callcontrol/provider/CC_Provider.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// Hears of the end of a provider: the line "o: provider destroyed".
///
///     RecordingProviderObserver observer("o");
///     std::ignore = provider.addProviderObserver(observer);
class RecordingProviderObserver : public CC_Provider::Observer, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingProviderObserver() override;

    void aboutDestroy(CC_Provider& provider) override;

    /// Runs inside the notification, after it has been recorded.
    Hook<void(CC_Provider&)> m_onDestroy;
};
