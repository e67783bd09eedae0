#include "testing/RecordingCallObserver.h"

#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

RecordingCallObserver::~RecordingCallObserver()
{
    for (CC_Call* const call : m_observed)
        call->removeCallObserver(this);
}

XCode RecordingCallObserver::observe(CC_Call& call)
{
    XCode const result = call.addCallObserver(this);
    FailingAllocator::Pause const unseen;
    if (result.isOk())
        m_observed.push_back(&call);
    return result;
}

void RecordingCallObserver::onCallObservationEnded(CC_Event<CC_Call> const& event)
{
    auto const& ended = CC_EvCallObservationEnded::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        std::erase(m_observed, ended.getSource());
        record(textOf(ended.getSource()) + " ended");
    }
    m_onEnded(ended);
}

void RecordingCallObserver::onCallCallLegAdded(CC_Event<CC_Call> const& event)
{
    auto const& added = CC_EvCallCallLegModified::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(added.getCallLeg()) + " joined " + textOf(added.getSource()));
    }
    m_onLegAdded(added);
}

void RecordingCallObserver::onCallCallLegRemoved(CC_Event<CC_Call> const& event)
{
    auto const& removed = CC_EvCallCallLegModified::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(removed.getCallLeg()) + " left " + textOf(removed.getSource()));
    }
    m_onLegRemoved(removed);
}

void RecordingCallObserver::onCallPropertyChanged(CC_Event<CC_Call> const& event)
{
    auto const& changed = CC_EvCallPropertyChanged::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(changed.getSource()) + " changed (" + PROPERTY_NAMES(changed.getFlags()) + ")");
    }
    m_onChanged(changed);
}
