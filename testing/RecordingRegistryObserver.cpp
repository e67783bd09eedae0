#include "testing/RecordingRegistryObserver.h"

#include "testing/FailingAllocator.h"

RecordingRegistryObserver::~RecordingRegistryObserver()
{
    FailingAllocator::Pause const unseen;
    CallControl::UNREGISTER_CONTEXT_OBSERVER(*this);
}

void RecordingRegistryObserver::contextAdded(String const& name)
{
    {
        FailingAllocator::Pause const unseen;
        record(std::string("context ") + name.c_str() + " added");
    }
    m_onAdded(name);
}

void RecordingRegistryObserver::contextDestroyed(String const& name)
{
    {
        FailingAllocator::Pause const unseen;
        record(std::string("context ") + name.c_str() + " destroyed");
    }
    m_onDestroyed(name);
}
