#pragma once

#include "platform/monitor/Monitor.h"

/// The log channel of call control: monitor 41.
namespace CC_Monitor
{
/// Call control's number among the monitors of RTD::REPOSITORY.
inline constexpr unsigned int ID = 41;

/// The channel when lines of this level are wanted, else null; nothing is to be formatted then.
inline RTD::Monitor const* FOR(RTD::Level level)
{
    return RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(ID, level);
}
} // namespace CC_Monitor
