#pragma once

#include "platform/base/TYTime.h"

/// Takes the place of the system's clocks while it lives: time stands still until the test moves it. One at a time.
///
///     DrivenClock clock;
///     pool.acquireCall();
///     clock.advance(1500);
///     pool.s_statistics.prepareGet(); // one call, 1500 call-milliseconds more
class DrivenClock
{
public:
    /// Both clock sources begin at this second.
    static constexpr long long FIRST_SECOND = 1000;

    DrivenClock();
    ~DrivenClock();
    DrivenClock(DrivenClock const&) = delete;
    DrivenClock& operator=(DrivenClock const&) = delete;

    /// Moves both clocks; a negative number moves them back, as a stepped time of day does.
    void advance(long long milliseconds);
    /// Moves both clocks to that moment.
    void set(TY::Time const& now);
    /// What both clock sources say.
    TY::Time const& getTime() const;
};
