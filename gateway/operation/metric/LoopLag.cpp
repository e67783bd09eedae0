#include "operation/metric/LoopLag.h"

#include <algorithm>

namespace
{
constexpr double LAG_SECONDS = LoopLag::INTERVAL / 1e3;

double SECONDS_BETWEEN(TY::Time const& before, TY::Time const& after)
{
    return static_cast<double>(after.seconds - before.seconds) +
           (static_cast<double>(after.nanoseconds) - static_cast<double>(before.nanoseconds)) / 1e9;
}
} // namespace

LoopLag::LoopLag(TYEventLoop& loop)
    : m_histogram({0.001, 0.002, 0.005, 0.01, 0.02, 0.05, 0.1, 0.2, 0.5, 1, 2, 5})
    , m_timer(
          loop, EventPrio::NORMAL, [](void* self) { static_cast<LoopLag*>(self)->onTimer(); }, this)
{
    start();
}

void LoopLag::start()
{
    m_started = TY::Time::NOW(TY::Time::MONOTONIC);
    m_timer.start(INTERVAL);
}

void LoopLag::onTimer()
{
    double const seconds = SECONDS_BETWEEN(m_started, TY::Time::NOW(TY::Time::MONOTONIC));
    m_histogram.note(std::max(0.0, seconds - LAG_SECONDS));
    start();
}
