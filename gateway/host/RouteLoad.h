#pragma once

#include "host/CallRate.h"
#include "platform/signalling/QCause.h"

#include <memory>
#include <utility>

/// The calls of a route that has limits. Shared by the routing, of before and after a reload, and by the calls. One
/// thread.
class RouteLoad
{
public:
    /// One of the calls, until it is destroyed.
    class Place
    {
    public:
        explicit Place(std::shared_ptr<RouteLoad> load) : m_load(std::move(load)) { ++m_load->m_calls; }
        ~Place() { --m_load->m_calls; }
        Place(Place const&) = delete;
        Place& operator=(Place const&) = delete;

    private:
        std::shared_ptr<RouteLoad> m_load;
    };

    /// 0: no limit.
    RouteLoad(unsigned int maxCalls, unsigned int maxCallsPerSecond) : m_maxCalls(maxCalls), m_rate(maxCallsPerSecond)
    {
    }
    /// For calls that begin from now on.
    void setLimits(unsigned int maxCalls, unsigned int maxCallsPerSecond)
    {
        m_maxCalls = maxCalls;
        m_rate.setLimit(maxCallsPerSecond);
    }
    /// NONE: one more may begin, and counts towards the rate; NO_CIRCUIT_CHANNEL_AVAILABLE: as many are up as may be;
    /// SWITCHING_EQUIPMENT_CONGESTION: too many began of late.
    QCause admit();
    unsigned int getCalls() const { return m_calls; }

private:
    unsigned int m_maxCalls;
    unsigned int m_calls = 0;
    CallRate m_rate;
};
