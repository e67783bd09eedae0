#include "host/CallRate.h"

#include <algorithm>
#include <utility>

void CallRate::setLimit(unsigned int perSecond)
{
    if (m_perSecond == 0) // nobody has counted until now
        m_tokens = perSecond;
    m_perSecond = perSecond;
    m_tokens = std::min<double>(m_tokens, m_perSecond);
}

bool CallRate::take()
{
    if (m_perSecond == 0)
        return true;
    refill();
    if (m_tokens < 1)
        return false;
    m_tokens -= 1;
    return true;
}

void CallRate::refill()
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    TY::Time const last = std::exchange(m_lastRefill, now);
    if (!std::exchange(m_hasStarted, true))
        return;
    double const seconds =
        static_cast<double>(now.seconds - last.seconds) + static_cast<double>(now.nanoseconds - last.nanoseconds) / 1e9;
    m_tokens = std::min<double>(m_perSecond, m_tokens + std::max(seconds, 0.0) * m_perSecond);
}
