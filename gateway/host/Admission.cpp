#include "host/Admission.h"

void Admission::setLimits(unsigned int maxCalls, unsigned int maxCallsPerSecond, unsigned int maxCallsPerSource)
{
    m_maxCalls = maxCalls;
    m_perSource = maxCallsPerSource;
    m_rate.setLimit(maxCallsPerSecond);
}

bool Admission::admit(unsigned int callsUp, InternetAddress const& source)
{
    if (!hasRoom(callsUp))
        return false;
    auto const ofSource = m_perSource != 0 ? m_calls.find(source) : m_calls.end();
    if (ofSource != m_calls.end() && ofSource->second >= m_perSource)
        return false;
    return m_rate.take();
}

void Admission::end(InternetAddress const& source)
{
    auto const found = m_calls.find(source);
    if (found != m_calls.end() && --found->second == 0)
        m_calls.erase(found);
}
