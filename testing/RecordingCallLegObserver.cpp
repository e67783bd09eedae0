#include "testing/RecordingCallLegObserver.h"

#include "services/CC_Service.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

RecordingCallLegObserver::~RecordingCallLegObserver()
{
    for (CC_CallLeg* const leg : m_observed)
        leg->removeCallLegObserver(this);
}

XCode RecordingCallLegObserver::observe(CC_CallLeg& leg)
{
    XCode const result = leg.addCallLegObserver(this);
    FailingAllocator::Pause const unseen;
    if (result.isOk())
        m_observed.push_back(&leg);
    return result;
}

void RecordingCallLegObserver::onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event)
{
    auto const& ended = CC_EvCallLegObservationEnded::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        std::erase(m_observed, ended.getSource());
        record(textOf(ended.getSource()) + " ended");
    }
    m_onEnded(ended);
}

void RecordingCallLegObserver::onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event)
{
    auto const& relinked = CC_EvCallLegCallRelinked::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(relinked.getSource()) + " moved from " + textOf(relinked.getOldCall()) + " to " +
               textOf(relinked.getNewCall()));
    }
    m_onRelinked(relinked);
}

void RecordingCallLegObserver::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    auto const& changed = CC_EvCallLegPropertyChanged::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(changed.getSource()) + " changed (" + PROPERTY_NAMES(changed.getFlags()) + ")");
    }
    m_onChanged(changed);
}

void RecordingCallLegObserver::onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event)
{
    auto const& asked = CC_EvCallLegSynchronousService::FROM(event);
    {
        FailingAllocator::Pause const unseen;
        String const text = asked.getService()->getInfo();
        record(textOf(asked.getSource()) + " asked (" + text.c_str() + ")");
    }
    m_onService(asked);
}
