#pragma once

#include "host/Admission.h"
#include "host/CallTrace.h"
#include "host/Counters.h"
#include "host/Routing.h"
#include "platform/base/String.h"

#include <functional>
#include <vector>

class SignallingLoop;

/// What the gateway gives its signalling modules, for all of them. Owned by the gateway, which outlives them; on the
/// signalling thread.
///
/// Call control is set up when a module sees this: its loop is CallControl::GET_CC_EVENT_LOOP(), and the media layer
/// stands behind the calls' contexts if `relaysMedia` says so (CallMedia::OF()).
struct GatewayHost
{
    SignallingLoop& loop;
    String contextName; ///< of call control
    Routing routing;
    Admission admission;
    CallTrace trace;
    Counters counters{};
    unsigned int lastCallNumber = 0;               ///< in logs and traces; the next call takes the next one
    bool relaysMedia = false;                      ///< through ports of ours
    bool isEnding = false;                         ///< no new calls
    std::function<void()> onEndpointGone{};        ///< to be told whenever an endpoint was destroyed; may be empty
    std::vector<std::function<void()>> onEnding{}; ///< modules that are to be told when no new calls come any more
};
