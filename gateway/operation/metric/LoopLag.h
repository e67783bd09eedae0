#pragma once

#include "host/MetricText.h"
#include "platform/base/TYTime.h"
#include "platform/eventloop/TYTimer.h"

/// How late a loop runs what is due: a timer that runs ten times a second says how much later than asked it did. On the
/// loop's thread.
///
///     LoopLag lag(loop);
///     text.add(lag.getHistogram());
class LoopLag
{
public:
    static constexpr unsigned int INTERVAL = 100; ///< milliseconds

    explicit LoopLag(TYEventLoop& loop);
    LoopLag(LoopLag const&) = delete;
    LoopLag& operator=(LoopLag const&) = delete;

    /// In seconds.
    MetricHistogram const& getHistogram() const { return m_histogram; }

private:
    void start();
    void onTimer();

    MetricHistogram m_histogram;
    TY::Time m_started;
    TYTimer m_timer;
};
