#include "host/Admission.h"

#include <algorithm>
#include <utility>

void Admission::setLimits(unsigned int maxCalls, unsigned int maxCallsPerSecond, unsigned int maxCallsPerSource)
{
    m_maxCalls = maxCalls;
    m_perSource = maxCallsPerSource;
    if (m_perSecond == 0) // nobody has counted until now
        m_tokens = maxCallsPerSecond;
    m_perSecond = maxCallsPerSecond;
    m_tokens = std::min<double>(m_tokens, m_perSecond);
}

bool Admission::admit(unsigned int callsUp, InternetAddress const& source)
{
    if (!hasRoom(callsUp))
        return false;
    auto const ofSource = m_perSource != 0 ? m_calls.find(source) : m_calls.end();
    if (ofSource != m_calls.end() && ofSource->second >= m_perSource)
        return false;
    if (m_perSecond == 0)
        return true;
    refill();
    if (m_tokens < 1)
        return false;
    m_tokens -= 1;
    return true;
}

void Admission::end(InternetAddress const& source)
{
    auto const found = m_calls.find(source);
    if (found != m_calls.end() && --found->second == 0)
        m_calls.erase(found);
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
