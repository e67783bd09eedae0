#pragma once

#include "host/MetricText.h"

/// How much processor time the turns of a loop take, each from one wait to the next one: what else is busy on the
/// machine does not count. What holds up a turn holds up every call. On the loop's thread.
///
///     TurnTime time;
///     loop.setTurnTime(&time);
class TurnTime
{
public:
    TurnTime();

    /// A turn is over; the first time, one begins.
    void note();
    /// In seconds.
    MetricHistogram const& getHistogram() const { return m_histogram; }

private:
    MetricHistogram m_histogram;
    double m_last = -1; // processor time of the thread; none yet
};
