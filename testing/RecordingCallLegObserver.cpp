#include "testing/RecordingCallLegObserver.h"

#include "services/CC_Service.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

RecordingCallLegObserver::~RecordingCallLegObserver() = default;

void RecordingCallLegObserver::onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event)
{
    auto const& ended = dynamic_cast<CC_EvCallLegObservationEnded const&>(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(ended.getSource()) + " ended");
    }
    m_onEnded(ended);
}

void RecordingCallLegObserver::onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event)
{
    auto const& relinked = dynamic_cast<CC_EvCallLegCallRelinked const&>(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(relinked.getSource()) + " moved from " + textOf(relinked.getOldCall()) + " to " +
               textOf(relinked.getNewCall()));
    }
    m_onRelinked(relinked);
}

void RecordingCallLegObserver::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    auto const& changed = dynamic_cast<CC_EvCallLegPropertyChanged const&>(event);
    {
        FailingAllocator::Pause const unseen;
        record(textOf(changed.getSource()) + " changed (" + PROPERTY_NAMES(changed.getFlags()) + ")");
    }
    m_onChanged(changed);
}

void RecordingCallLegObserver::onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event)
{
    auto const& asked = dynamic_cast<CC_EvCallLegSynchronousService const&>(event);
    {
        FailingAllocator::Pause const unseen;
        String const text = asked.getService()->getInfo();
        record(textOf(asked.getSource()) + " asked (" + text.c_str() + ")");
    }
    m_onService(asked);
}
