#include "sip/SipModule.h"

#include "configuration/Configuration.h"

CALLCONTROL_GATEWAY_MODULE(SipModule)
