#pragma once

#include "configuration/AddressRange.h"
#include "host/CallRate.h"

#include <map>

/// Decides whether one more call may begin: by how many are up, how many of one source are, and how many began of late.
/// Transactions outlive their calls by half a minute, so a rate without a limit costs memory without a limit.
///
/// One thread.
///
///     if (!admission.admit(CallControl::GET_NUMBER_OF_CALLS(), source))
///         ... // 503
///     admission.begin(source); // and, when the call is over, end(source)
class Admission
{
public:
    /// 0: no limit.
    Admission(unsigned int maxCalls, unsigned int maxCallsPerSecond, unsigned int maxCallsPerSource = 0)
        : m_maxCalls(maxCalls), m_perSource(maxCallsPerSource), m_rate(maxCallsPerSecond)
    {
    }

    /// For calls that begin from now on. 0: no limit.
    void setLimits(unsigned int maxCalls, unsigned int maxCallsPerSecond, unsigned int maxCallsPerSource);
    /// Whether the call may begin; one that may counts towards the rate. `callsUp`: without it.
    bool admit(unsigned int callsUp, InternetAddress const& source);
    /// Whether one could but for the rate and the source: for who asks and does not call.
    bool hasRoom(unsigned int callsUp) const { return m_maxCalls == 0 || callsUp < m_maxCalls; }

    /// A call of the source is up, until `end`. Throws std::bad_alloc.
    void begin(InternetAddress const& source) { ++m_calls[source]; }
    void end(InternetAddress const& source);

private:
    unsigned int m_maxCalls;
    unsigned int m_perSource;
    CallRate m_rate;
    std::map<InternetAddress, unsigned int> m_calls; // by source, those with one at least
};
