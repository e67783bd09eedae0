#pragma once

#include "host/Admission.h"
#include "host/CallTrace.h"
#include "host/Counters.h"
#include "host/RouteHunt.h"
#include "platform/base/String.h"

#include <ctime>
#include <functional>
#include <set>
#include <string>
#include <string_view>
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
    bool isEnding = false;                         ///< no new calls, and the process ends with the last one
    std::function<void()> onEndpointGone{};        ///< to be told whenever an endpoint was destroyed; may be empty
    bool isDraining = false;                       ///< no new calls for now
    std::function<bool()> mustRefuse{};            ///< no new calls as long as it says so; may be empty
    std::set<std::string> blocked{};               ///< interfaces that an operator has taken out of service
    std::vector<std::function<void()>> onEnding{}; ///< modules that are to be told when no new calls come any more
    std::vector<std::function<void()>> onReload{}; ///< those that read files of theirs again with the configuration
    std::set<std::string> leaving{};               ///< interfaces that are configured no more and go with their calls

    /// Whether new calls may come in on that interface.
    bool takesCallsFrom(std::string const& interface) const
    {
        return !isEnding && !isDraining && !isBlocked(interface) && (!mustRefuse || !mustRefuse());
    }
    /// By which routes a call that comes in there leaves now.
    RouteHunt findRoutes(std::string_view from, std::string_view number, std::string_view calling,
                         unsigned int callNumber) const
    {
        unsigned int const minute = WeekHours::MINUTE_OF(std::time(nullptr));
        return {routing.find({from, number, calling, minute, callNumber}), number};
    }
    /// Whether no new call may come in or leave there.
    bool isBlocked(std::string const& interface) const
    {
        return blocked.contains(interface) || leaving.contains(interface);
    }
};
