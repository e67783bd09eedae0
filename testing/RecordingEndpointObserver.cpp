#include "testing/RecordingEndpointObserver.h"

#include "testing/FailingAllocator.h"

RecordingEndpointObserver::~RecordingEndpointObserver() = default;

void RecordingEndpointObserver::aboutFinished(CC_Endpoint& endpoint)
{
    {
        FailingAllocator::Pause const unseen;
        record("endpoint finished");
    }
    m_onFinished(endpoint);
}

void RecordingEndpointObserver::aboutDestroy(CC_Endpoint& endpoint)
{
    {
        FailingAllocator::Pause const unseen;
        record("endpoint destroyed");
    }
    m_onDestroy(endpoint);
}
