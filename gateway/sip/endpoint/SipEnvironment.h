#pragma once

#include "host/Admission.h"
#include "host/CallTrace.h"
#include "host/Counters.h"
#include "host/Routing.h"
#include "platform/base/String.h"

#include <functional>
#include <vector>

class SipInterface;
class SipStack;

/// What all SIP interfaces of the gateway share. Owned by the gateway, which outlives them.
struct SipEnvironment
{
    SipStack& stack;
    String contextName; ///< of call control
    Routing routing;
    Admission admission;
    CallTrace trace;
    Counters counters{};
    unsigned int lastCallNumber = 0;
    bool relaysMedia = false;                ///< through ports of ours
    bool isEnding = false;                   ///< no new calls
    std::function<void()> onEndpointGone{};  ///< told when an endpoint was destroyed; may be empty
    std::vector<SipInterface*> interfaces{}; ///< they enter and leave by themselves
};
