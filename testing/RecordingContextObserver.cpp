#include "testing/RecordingContextObserver.h"

#include "testing/FailingAllocator.h"

RecordingContextObserver::~RecordingContextObserver()
{
    for (CC_Context* const context : m_observed)
        context->removeContextObserver(*this);
}

XCode RecordingContextObserver::observe(CC_Context& context)
{
    XCode const result = context.addContextObserver(*this);
    FailingAllocator::Pause const unseen;
    if (result.isOk())
        m_observed.push_back(&context);
    return result;
}

void RecordingContextObserver::recordOf(CC_Context const& context, std::string const& what)
{
    record(std::string(context.getName().c_str()) + " " + what);
}

void RecordingContextObserver::aboutDestroy(CC_Context& context)
{
    {
        FailingAllocator::Pause const unseen;
        std::erase(m_observed, &context);
        recordOf(context, "destroyed");
    }
    m_onDestroy(context);
}

void RecordingContextObserver::aboutAddProvider(CC_Context& context, String const& name)
{
    {
        FailingAllocator::Pause const unseen;
        recordOf(context, std::string("provider ") + name.c_str() + " added");
    }
    m_onAddProvider(context, name);
}

void RecordingContextObserver::aboutRemoveProvider(CC_Context& context, String const& name)
{
    {
        FailingAllocator::Pause const unseen;
        recordOf(context, std::string("provider ") + name.c_str() + " removed");
    }
    m_onRemoveProvider(context, name);
}

void RecordingContextObserver::aboutCreateCall(CC_Context& context, CC_Call* call)
{
    {
        FailingAllocator::Pause const unseen;
        recordOf(context, textOf(call) + " created");
    }
    m_onCreateCall(context, call);
}

void RecordingContextObserver::aboutDestroyCall(CC_Context& context, CC_Call* call)
{
    {
        FailingAllocator::Pause const unseen;
        recordOf(context, textOf(call) + " destroyed");
    }
    m_onDestroyCall(context, call);
}
