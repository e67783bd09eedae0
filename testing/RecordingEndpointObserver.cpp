#include "testing/RecordingEndpointObserver.h"

#include "testing/FailingAllocator.h"

RecordingEndpointObserver::~RecordingEndpointObserver()
{
    for (CC_Endpoint* const endpoint : m_observed)
        endpoint->removeEndpointObserver(*this);
}

XCode RecordingEndpointObserver::observe(CC_Endpoint& endpoint)
{
    XCode const result = endpoint.addEndpointObserver(*this);
    FailingAllocator::Pause const unseen;
    if (result.isOk())
        m_observed.push_back(&endpoint);
    return result;
}

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
        std::erase(m_observed, &endpoint);
        record("endpoint destroyed");
    }
    m_onDestroy(endpoint);
}
