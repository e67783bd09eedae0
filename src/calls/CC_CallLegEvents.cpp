#include "calls/CC_CallLegEvents.h"

template class CC_Event<CC_CallLeg>;

CC_EvCallLegObservationEnded::~CC_EvCallLegObservationEnded() = default;
CC_EvCallLegCallRelinked::~CC_EvCallLegCallRelinked() = default;
CC_EvCallLegPropertyChanged::~CC_EvCallLegPropertyChanged() = default;
CC_EvCallLegSynchronousService::~CC_EvCallLegSynchronousService() = default;
