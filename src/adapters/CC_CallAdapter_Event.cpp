#include "adapters/CC_CallAdapter_Event.h"

#include "adapters/CC_CallAdapterObserver.h"
#include "adapters/CC_CallAdapter_Attempt.h"

#include <utility>

CC_CallAdapter::Event::Event(TYEventLoop& loop, EventPrio::Type priority, CC_CallAdapter& adapter)
    : TYEvent(loop, priority, nullptr, nullptr), m_adapter(adapter)
{
}

XCode CC_CallAdapter::Event::setPeerPropertyChange(unsigned int id)
{
    return m_flags.set(id, true).isOk() && (isPending() || setIfNotPending().isOk()) ? XCode::OK : XCode::FAILURE;
}

void CC_CallAdapter::Event::handle()
{
    if (m_adapter.hasToCatchUp())
    {
        Attempt const attempt(m_adapter);
        m_adapter.catchUp();
        if (attempt.isOver())
            return;
    }
    CC_Flags const flags(std::move(m_flags)); // what changes inside the notification belongs to the next turn
    if (flags.isEmpty())
        return;
    if (m_adapter.m_observer != nullptr)
        m_adapter.m_observer->notifyPeerPropertyChange(m_adapter, flags);
    else
        m_adapter.notifyPeerPropertyChange(flags);
}
