#pragma once

#include "environment/CC_Environment.h"
#include "platform/base/Export.h"
#include "platform/eventloop/TYEventLoop.h"

/// When something happened in call control: in which turn of its event loop, and at what time.
///
/// All that happens in one turn has one time; between turns, when the host's code is at work, it is that of the
/// system's last tick (TYEventLoop::getTime). Belongs to the call-control loop's thread.
///
///     CC_Moment const began = CC_Moment::NOW();
///     ...
///     long long const age = CC_Moment::NOW().nanoseconds - began.nanoseconds;
struct CC_EXPORT CC_Moment
{
    unsigned long long turn = 0; ///< how many turns had begun
    long long nanoseconds = 0;   ///< of the monotonic clock (TY::Time::MONOTONIC)

    /// Turn and time 0 without a call-control loop.
    static CC_Moment NOW()
    {
        TYEventLoop* const loop = CC_Environment::CC_EVENT_LOOP();
        return loop != nullptr ? CC_Moment{loop->getNumberOfTurns(), loop->getTime()} : CC_Moment();
    }

    /// The same turn and time.
    friend bool operator==(CC_Moment const&, CC_Moment const&) = default;
};
