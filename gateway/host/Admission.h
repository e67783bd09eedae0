#pragma once

#include "platform/base/TYTime.h"

/// Decides whether one more call may begin: by how many are up, and by how many began of late. Transactions outlive
/// their calls by half a minute, so a rate without a limit costs memory without a limit.
///
/// The rate is a bucket that holds one second's worth of calls and fills up evenly. One thread.
///
///     if (!admission.admit(CallControl::GET_NUMBER_OF_CALLS()))
///         ... // 503
class Admission
{
public:
    /// 0: no limit.
    Admission(unsigned int maxCalls, unsigned int maxCallsPerSecond)
        : m_maxCalls(maxCalls), m_perSecond(maxCallsPerSecond), m_tokens(maxCallsPerSecond)
    {
    }

    /// Whether the call may begin; one that may counts towards the rate. `callsUp`: without it.
    bool admit(unsigned int callsUp);

private:
    void refill();

    unsigned int m_maxCalls;
    unsigned int m_perSecond;
    double m_tokens;
    TY::Time m_lastRefill;
    bool m_hasStarted = false;
};
