#pragma once

#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Kept.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_Flags.h"

#include <memory>
#include <new>

/// Collects the ids of changed peer and call properties and tells the module of them in the loop's next turn.
class CC_CallAdapter::Event : public TYEvent
{
public:
    Event(TYEventLoop& loop, EventPrio::Type priority, CC_CallAdapter& adapter);

    /// Marks the id and posts the event. OK, or FAILURE.
    XCode setPeerPropertyChange(unsigned int id);

    /// What filters have worked on: here, since it is the attempt's and an adapter cannot grow. Made when it is first
    /// asked for; null when memory is out.
    Kept* getKept()
    {
        if (m_kept == nullptr)
            m_kept.reset(new (std::nothrow) Kept);
        return m_kept.get();
    }

protected:
    ~Event() override = default;
    void handle() override;

private:
    friend class CC_Inside;

    void record(CC_Flags const& flags) const;

    CC_CallAdapter& m_adapter;
    CC_Flags m_flags;
    std::unique_ptr<Kept> m_kept;
};
