#pragma once

#include "host/GatewayHost.h"

#include <vector>

class SipInterface;
class SipStack;

/// What all SIP interfaces of the gateway share. Owned by the SIP module, which outlives them.
struct SipEnvironment
{
    GatewayHost& host;
    SipStack& stack;
    std::vector<SipInterface*> interfaces{}; ///< they enter and leave by themselves
};
