#include "testing/RecordingProviderObserver.h"

#include "testing/FailingAllocator.h"

RecordingProviderObserver::~RecordingProviderObserver() = default;

void RecordingProviderObserver::aboutDestroy(CC_Provider& provider)
{
    {
        FailingAllocator::Pause const unseen;
        record("provider destroyed");
    }
    m_onDestroy(provider);
}
