#include "calls/CC_CallEvents.h"

template class CC_Event<CC_Call>;

CC_EvCallObservationEnded::~CC_EvCallObservationEnded() = default;
CC_EvCallCallLegModified::~CC_EvCallCallLegModified() = default;
CC_EvCallPropertyChanged::~CC_EvCallPropertyChanged() = default;
