#pragma once

#include "platform/base/Export.h"

namespace TY
{
/// A moment of a clock, as seconds and nanoseconds (0 to 999999999).
///
///     TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
struct CC_EXPORT Time
{
    /// The clock sources: time since start-up, which never steps, and the time of day.
    enum Source : unsigned int
    {
        MONOTONIC = 0,
        REALTIME = 1,
        MONOTONIC_COARSE = 2 ///< the first as of the system's last tick, up to 10 ms ago: four times as quick to read
    };
    /// Replaces the system's clocks; null restores them. Tests drive time with it.
    using Clock = Time (*)(unsigned int source);

    /// Since the clock's beginning: whole seconds, and the rest, 0 to 999999999. @{
    long long seconds = 0;
    long nanoseconds = 0;
    /// @}

    /// The moment by that source; a number that is none stands for MONOTONIC. Any thread.
    static Time NOW(unsigned int source);
    /// For the whole process, at once. Any thread.
    static void SET_CLOCK(Clock clock);

    /// The same moment; the sources are not told apart.
    friend bool operator==(Time const&, Time const&) = default;
};
} // namespace TY
