#pragma once

#include "configuration/DialPlan.h"
#include "host/Counters.h"
#include "host/RouteHunt.h"
#include "host/SignallingLoop.h"
#include "platform/base/String.h"

#include <functional>
#include <string>

/// What all ISDN interfaces of the gateway share, and what they need of it. Outlives them.
struct IsdnEnvironment
{
    SignallingLoop& watch;
    String contextName; ///< of call control
    /// By which routes a call of that interface leaves.
    std::function<RouteHunt(std::string const& from, std::string const& number, std::string const& calling,
                            unsigned int callNumber)>
        findRoutes;
    /// A new call from that interface: its number; 0: it is not admitted.
    std::function<unsigned int(std::string const& from)> beginCall;
    /// Whether that interface is out of service.
    std::function<bool(std::string const& interface)> isBlocked;
    DialPlan const& dialPlan; ///< how numbers are dialled here
    Counters& counters;
    bool relaysMedia = false; ///< there is a media layer
    /// Told when an endpoint was destroyed, and when the far side has its last word; may be empty.
    std::function<void()> onEndpointGone{};
};
