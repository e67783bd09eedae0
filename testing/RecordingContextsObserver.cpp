#include "testing/RecordingContextsObserver.h"

#include "testing/FailingAllocator.h"

RecordingContextsObserver::~RecordingContextsObserver() = default;

void RecordingContextsObserver::contextAdded(String const& name)
{
    {
        FailingAllocator::Pause const unseen;
        record(std::string("context ") + name.c_str() + " added");
    }
    m_onAdded(name);
}

void RecordingContextsObserver::contextDestroyed(String const& name)
{
    {
        FailingAllocator::Pause const unseen;
        record(std::string("context ") + name.c_str() + " destroyed");
    }
    m_onDestroyed(name);
}
