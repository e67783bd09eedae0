#include "isdn/IsdnModule.h"

#include "configuration/Configuration.h"

CALLCONTROL_GATEWAY_MODULE(IsdnModule)
