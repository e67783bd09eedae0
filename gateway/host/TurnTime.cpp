#include "host/TurnTime.h"

#include <ctime>

namespace
{
double PROCESSOR_SECONDS()
{
    timespec now = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
}
} // namespace

TurnTime::TurnTime() : m_histogram({0.0001, 0.0002, 0.0005, 0.001, 0.002, 0.005, 0.01, 0.02, 0.05, 0.1}) {}

void TurnTime::note()
{
    double const now = PROCESSOR_SECONDS();
    if (m_last >= 0)
        m_histogram.note(now - m_last);
    m_last = now;
}
