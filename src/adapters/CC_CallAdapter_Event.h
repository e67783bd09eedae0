#pragma once

#include "adapters/CC_CallAdapter.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_Flags.h"

/// Collects the ids of changed peer and call properties and tells the module of them in the loop's next turn.
class CC_CallAdapter::Event : public TYEvent
{
public:
    Event(TYEventLoop& loop, EventPrio::Type priority, CC_CallAdapter& adapter);

    /// Marks the id and posts the event. OK, or FAILURE.
    XCode setPeerPropertyChange(unsigned int id);

protected:
    ~Event() override = default;
    void handle() override;

private:
    CC_CallAdapter& m_adapter;
    CC_Flags m_flags;
};
