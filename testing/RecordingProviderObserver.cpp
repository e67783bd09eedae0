#include "testing/RecordingProviderObserver.h"

#include "testing/FailingAllocator.h"

RecordingProviderObserver::~RecordingProviderObserver()
{
    for (CC_Provider* const provider : m_observed)
        provider->removeProviderObserver(*this);
}

XCode RecordingProviderObserver::observe(CC_Provider& provider)
{
    XCode const result = provider.addProviderObserver(*this);
    FailingAllocator::Pause const unseen;
    if (result.isOk())
        m_observed.push_back(&provider);
    return result;
}

void RecordingProviderObserver::aboutDestroy(CC_Provider& provider)
{
    {
        FailingAllocator::Pause const unseen;
        std::erase(m_observed, &provider);
        record("provider destroyed");
    }
    m_onDestroy(provider);
}
