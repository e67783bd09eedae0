#include "platform/eventloop/TYEvent.h"

#include "platform/base/Assert.h"
#include "platform/eventloop/TYEventLoop.h"

#include <algorithm>

std::atomic<unsigned int> TYEvent::s_numberOfInstances{0};

TYEvent::TYEvent(TYEventLoop& loop, EventPrio::Type priority, Callback callback, void* argument)
    : m_loop(loop)
    , m_callback(callback)
    , m_argument(argument)
    , m_priority(static_cast<unsigned char>(std::min<unsigned int>(priority, EventPrio::COUNT - 1)))
{
    TY_ASSERT(priority < EventPrio::COUNT, "an event of a priority that the loop does not have");
    s_numberOfInstances.fetch_add(1, std::memory_order_relaxed);
}

TYEvent::~TYEvent() { s_numberOfInstances.fetch_sub(1, std::memory_order_relaxed); }

XCode TYEvent::setIfNotPending()
{
    if (!m_isPending.exchange(true))
        return m_loop.post(*this);
    return m_isDestroyed.load() ? XCode::REFUSED : XCode::OK;
}

void TYEvent::destroy()
{
    m_loop.withdraw(*this);
    removeReference();
}

void TYEvent::addReference() { m_references.fetch_add(1, std::memory_order_relaxed); }

void TYEvent::removeReference()
{
    if (m_references.fetch_sub(1, std::memory_order_acq_rel) == 1)
        delete this;
}

void TYEvent::handle() { m_callback(m_argument); }
