#include "calls/CC_Observer.h"

#include "calls/CC_CallLegObserver.h"
#include "calls/CC_CallObserver.h"

// One home for the type information of the interfaces, which casts across shared objects rely on.
CC_Observer::~CC_Observer() = default;
CC_CallObserver::~CC_CallObserver() = default;
CC_CallLegObserver::~CC_CallLegObserver() = default;
