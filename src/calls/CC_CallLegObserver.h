#pragma once

#include "calls/CC_CallLegEvents.h"
#include "calls/CC_Observer.h"

/// Hears about one or more call legs (`CC_CallLeg::addCallLegObserver`, or `CC_Call::addCallLegObserver` for every leg
/// of a call), synchronously, on the call-control loop's thread. What it may do inside: see CC_CallObserver.
class CC_EXPORT CC_CallLegObserver : public CC_Observer
{
public:
    ~CC_CallLegObserver() override;
    virtual void onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event) = 0;   ///< CC_EvCallLegObservationEnded
    virtual void onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event) = 0;       ///< CC_EvCallLegCallRelinked
    virtual void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) = 0;    ///< CC_EvCallLegPropertyChanged
    virtual void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) = 0; ///< CC_EvCallLegSynchronousService
};
