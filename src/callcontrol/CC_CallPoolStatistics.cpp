#include "callcontrol/CC_CallPool.h"

void CC_CallPool::Statistics::onCallAdded()
{
    TYAutoLock<TYMutex> const lock(s_mutex);
    updateCallTime();
    ++m_callsAdded;
    updateMaxActiveCalls();
}

void CC_CallPool::Statistics::onCallRemoved()
{
    TYAutoLock<TYMutex> const lock(s_mutex);
    updateCallTime();
    ++m_callsRemoved;
}

void CC_CallPool::Statistics::prepareGet()
{
    TYAutoLock<TYMutex> const lock(s_mutex);
    updateCallTime();
    updateMaxActiveCalls();
}

void CC_CallPool::Statistics::updateCallTime()
{
    TY::Time const now = TY::Time::NOW(0);
    if (s_tLastUpdate.seconds != 0)
    {
        long long seconds = now.seconds - s_tLastUpdate.seconds;
        long long nanoseconds = now.nanoseconds - s_tLastUpdate.nanoseconds;
        if (nanoseconds < 0)
        {
            --seconds;
            nanoseconds += 1000000000;
        }
        // signed until here, so that a clock that was set back takes its time off again
        long long const milliseconds = seconds * 1000 + nanoseconds / 1000000;
        m_callTime += static_cast<unsigned long long>(milliseconds) * (m_callsAdded - m_callsRemoved);
    }
    s_tLastUpdate = now;
}

void CC_CallPool::Statistics::updateMaxActiveCalls()
{
    unsigned long long const active = m_callsAdded - m_callsRemoved;
    if (active > m_maxActiveCalls)
        m_maxActiveCalls = active;
}
