#include "platform/base/TYTime.h"

#include <atomic>
#include <ctime>

namespace
{
std::atomic<TY::Time::Clock> s_clock{nullptr};

clockid_t CLOCK_OF(unsigned int source)
{
    return source == TY::Time::REALTIME           ? CLOCK_REALTIME
           : source == TY::Time::MONOTONIC_COARSE ? CLOCK_MONOTONIC_COARSE
                                                  : CLOCK_MONOTONIC;
}
} // namespace

TY::Time TY::Time::NOW(unsigned int source)
{
    if (Clock const clock = s_clock.load(std::memory_order_relaxed))
        return clock(source);
    timespec now{};
    clock_gettime(CLOCK_OF(source), &now);
    return {now.tv_sec, now.tv_nsec};
}

void TY::Time::SET_CLOCK(Clock clock) { s_clock.store(clock, std::memory_order_relaxed); }
