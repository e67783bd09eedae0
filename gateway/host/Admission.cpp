#include "host/Admission.h"

#include <algorithm>
#include <utility>

bool Admission::admit(unsigned int callsUp)
{
    if (m_maxCalls != 0 && callsUp >= m_maxCalls)
        return false;
    if (m_perSecond == 0)
        return true;
    refill();
    if (m_tokens < 1)
        return false;
    m_tokens -= 1;
    return true;
}

void Admission::refill()
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    TY::Time const last = std::exchange(m_lastRefill, now);
    if (!std::exchange(m_hasStarted, true))
        return;
    double const seconds =
        static_cast<double>(now.seconds - last.seconds) + static_cast<double>(now.nanoseconds - last.nanoseconds) / 1e9;
    m_tokens = std::min<double>(m_perSecond, m_tokens + std::max(seconds, 0.0) * m_perSecond);
}
