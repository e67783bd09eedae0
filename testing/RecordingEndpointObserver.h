#pragma once

#include "callcontrol/provider/CC_Endpoint.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// Hears of the end of an endpoint: the lines "o: endpoint finished" and "o: endpoint destroyed".
///
///     RecordingEndpointObserver observer("o");
///     std::ignore = endpoint.addEndpointObserver(observer);
class RecordingEndpointObserver : public CC_Endpoint::Observer, public Recorder
{
public:
    using Recorder::Recorder;
    ~RecordingEndpointObserver() override;

    void aboutFinished(CC_Endpoint& endpoint) override;
    void aboutDestroy(CC_Endpoint& endpoint) override;

    /// These run inside the notification, after it has been recorded.
    Hook<void(CC_Endpoint&)> m_onFinished;
    Hook<void(CC_Endpoint&)> m_onDestroy;
};
