#include "testing/DrivenClock.h"

namespace
{
constexpr long long NANOSECONDS = 1000000000;
TY::Time s_now;

TY::Time DRIVEN_NOW(unsigned int) { return s_now; }
} // namespace

DrivenClock::DrivenClock()
{
    s_now = TY::Time{FIRST_SECOND, 0};
    TY::Time::SET_CLOCK(DRIVEN_NOW);
}

DrivenClock::~DrivenClock() { TY::Time::SET_CLOCK(nullptr); }

void DrivenClock::advance(long long milliseconds)
{
    long long nanoseconds = s_now.nanoseconds + milliseconds % 1000 * 1000000;
    long long seconds = s_now.seconds + milliseconds / 1000;
    if (nanoseconds < 0)
    {
        nanoseconds += NANOSECONDS;
        --seconds;
    }
    s_now.seconds = seconds + nanoseconds / NANOSECONDS;
    s_now.nanoseconds = static_cast<long>(nanoseconds % NANOSECONDS);
}

void DrivenClock::set(TY::Time const& now) { s_now = now; }

TY::Time const& DrivenClock::getTime() const { return s_now; }
