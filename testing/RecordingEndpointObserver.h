#pragma once

#include "callcontrol/provider/CC_Endpoint.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// Hears of the end of an endpoint: the lines "o: endpoint finished" and "o: endpoint destroyed".
///
///     RecordingEndpointObserver observer("o");
///     std::ignore = observer.observe(endpoint);
class RecordingEndpointObserver : public CC_Endpoint::Observer, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingEndpointObserver() override; ///< stops observing

    /// Registers with the endpoint until either ends, and gives the result of that. Whoever registers the observer
    /// without this takes it out again without it, before the observer ends.
    XCode observe(CC_Endpoint& endpoint);

    void aboutFinished(CC_Endpoint& endpoint) override;
    void aboutDestroy(CC_Endpoint& endpoint) override;

    /// These run inside the notification, after it has been recorded. @{
    Hook<void(CC_Endpoint&)> m_onFinished;
    Hook<void(CC_Endpoint&)> m_onDestroy;
    /// @}

private:
    std::vector<CC_Endpoint*> m_observed;
};
