#include "adapters/CC_CallAdapter_Event.h"

#include "adapters/CC_CallAdapterObserver.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "recorder/CC_RecordWriter.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <new>
#include <utility>

CC_CallAdapter::Event::Event(TYEventLoop& loop, EventPrio::Type priority, CC_CallAdapter& adapter)
    : TYEvent(loop, priority, nullptr, nullptr), m_adapter(adapter)
{
}

XCode CC_CallAdapter::Event::setPeerPropertyChange(unsigned int id)
{
    return m_flags.set(id, true).isOk() && (isPending() || setIfNotPending().isOk()) ? XCode::OK : XCode::FAILURE;
}

/// Apart, so that who does not record does not pay for it.
__attribute__((noinline)) void CC_CallAdapter::Event::record(CC_Flags const& flags) const
{
    CC_RecordWriter& recorder = CC_RecordWriter::INSTANCE();
    using CC_RecordFormat::ToldIds;
    static_assert(sizeof(ToldIds) == sizeof(CC_Flags::Entry) &&
                  offsetof(ToldIds, bits) == offsetof(CC_Flags::Entry, bits));
    unsigned int const count = flags.getCount();
    char* const place =
        recorder.begin(CC_RecordFormat::Kind::TOLD, m_adapter.getCallSerial(), m_adapter.getLegSerial(), count);
    std::size_t const size = std::min(count, CC_RecordFormat::MOST_TOLD) * sizeof(ToldIds);
    if (size == sizeof(ToldIds)) [[likely]]
        std::memcpy(place, &flags.getEntry(0), sizeof(ToldIds));
    else
        std::memcpy(place, &flags.getEntry(0), size);
    recorder.end(place + size);
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
    if (CC_RecordWriter::ON() != nullptr)
        record(flags);
    if (m_adapter.m_observer != nullptr)
        m_adapter.m_observer->notifyPeerPropertyChange(m_adapter, flags);
    else
        m_adapter.notifyPeerPropertyChange(flags);
}
