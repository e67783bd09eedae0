#include "platform/base/TYTime.h"

#include <atomic>
#include <ctime>

namespace
{
std::atomic<TY::Time::Clock> s_clock{nullptr};
}

TY::Time TY::Time::NOW(unsigned int source)
{
    if (Clock const clock = s_clock.load(std::memory_order_relaxed))
        return clock(source);
    timespec now{};
    clock_gettime(source == REALTIME ? CLOCK_REALTIME : CLOCK_MONOTONIC, &now);
    return {now.tv_sec, now.tv_nsec};
}

void TY::Time::SET_CLOCK(Clock clock) { s_clock.store(clock, std::memory_order_relaxed); }
