#pragma once

#include "operation/record/CallRecord.h"

#include <string>

/// The one line that the log has of a call.
///
///     call 12: 4420 on a to 4989123 on b, answered after 2.134 s, over after 65.338 s, cleared by a, cause 16
///     (normal-call-clearing), ids 1@192.0.2.1 and 2@192.0.2.7
namespace CallLine
{
/// Numbers that may not be presented are "(withheld)"; characters that would steer a terminal are shown as "\x1b".
std::string TEXT_OF(CallRecord const& record);
/// A leg's number as it may be shown: "(withheld)", "(none)".
std::string NUMBER_OF(CallRecord::Leg const& leg);
} // namespace CallLine
