#pragma once

#include "calls/CC_CallEvents.h"
#include "calls/CC_Observer.h"

/// Hears about one or more calls (`CC_Call::addCallObserver`), synchronously, on the call-control loop's thread.
///
/// Inside any of these an observer may do anything: remove itself or others, add others, drop or destroy an adapter,
/// transfer, release the call, destroy the context.
class CC_EXPORT CC_CallObserver : public CC_Observer
{
public:
    ~CC_CallObserver() override;
    virtual void onCallObservationEnded(CC_Event<CC_Call> const& event) = 0; ///< CC_EvCallObservationEnded
    virtual void onCallCallLegAdded(CC_Event<CC_Call> const& event) = 0;     ///< CC_EvCallCallLegModified
    virtual void onCallCallLegRemoved(CC_Event<CC_Call> const& event) = 0;   ///< CC_EvCallCallLegModified
    virtual void onCallPropertyChanged(CC_Event<CC_Call> const& event) = 0;  ///< CC_EvCallPropertyChanged
};
