#pragma once

#include "configuration/DialPlan.h"
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

class Capture;
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
    DialPlan dialPlan{};
    Capture* capture = nullptr; ///< that is to be shown what goes over the wire; null: nobody is

    /// Whether new calls may come in on that interface.
    bool takesCallsFrom(std::string const& interface) const
    {
        return !isEnding && !isDraining && !isBlocked(interface) && (!mustRefuse || !mustRefuse());
    }
    /// By which routes a call that comes in there leaves now; `number` as it was dialled, `user` as whom the interface
    /// knows the caller, if it does. An emergency number is looked for as it is, any other one in its international
    /// form.
    RouteHunt findRoutes(std::string_view from, std::string_view number, std::string_view calling,
                         unsigned int callNumber, std::string_view user = {}) const
    {
        unsigned int const minute = WeekHours::MINUTE_OF(std::time(nullptr));
        if (dialPlan.isEmpty() || routing.isEmergency(from, number))
            return {routing.find({from, number, calling, minute, callNumber, user}), number};
        std::string const whole = dialPlan.normalise(number);
        return {routing.find({from, whole, dialPlan.normalise(calling), minute, callNumber, user}), whole,
                whole != number};
    }
    /// Whether more digits could give the number a route.
    bool isBeginning(std::string_view from, std::string_view number) const
    {
        return dialPlan.isBeginning(number) || routing.isBeginning(from, dialPlan.normalise(number));
    }
    /// Whether a call to that number, which comes in there, may be refused for no limit and by no operator.
    bool isEmergency(std::string_view from, std::string_view number) const
    {
        return !isEnding && routing.isEmergency(from, number);
    }
    /// Whether no new call may come in or leave there.
    bool isBlocked(std::string const& interface) const
    {
        return blocked.contains(interface) || leaving.contains(interface);
    }
};
