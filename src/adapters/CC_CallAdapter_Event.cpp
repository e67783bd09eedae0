#include "adapters/CC_CallAdapter_Event.h"

#include "adapters/CC_CallAdapterObserver.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "recorder/CC_RecordWriter.h"

#include <algorithm>
#include <utility>

CC_CallAdapter::Event::Event(TYEventLoop& loop, EventPrio::Type priority, CC_CallAdapter& adapter)
    : TYEvent(loop, priority, nullptr, nullptr), m_adapter(adapter)
{
}

XCode CC_CallAdapter::Event::setPeerPropertyChange(unsigned int id)
{
    return m_flags.set(id, true).isOk() && (isPending() || setIfNotPending().isOk()) ? XCode::OK : XCode::FAILURE;
}

void CC_CallAdapter::Event::record(CC_RecordWriter& recorder, CC_Flags const& flags) const
{
    recorder.begin(CC_RecordFormat::Kind::TOLD, m_adapter.getCallSerial(), m_adapter.getLegSerial(), 0);
    auto* const listed = reinterpret_cast<unsigned int*>(recorder.getPlace());
    unsigned int count = 0;
    flags.forEachSet(
        [listed, &count](unsigned int id)
        {
            if (count < CC_RecordFormat::MOST_LISTED_IDS)
                listed[count] = id;
            ++count;
            return true;
        });
    recorder.goOnAt(reinterpret_cast<char*>(listed + std::min(count, CC_RecordFormat::MOST_LISTED_IDS)));
    recorder.setDetail(count);
    recorder.end();
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
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        record(*recorder, flags);
    if (m_adapter.m_observer != nullptr)
        m_adapter.m_observer->notifyPeerPropertyChange(m_adapter, flags);
    else
        m_adapter.notifyPeerPropertyChange(flags);
}
