#pragma once

#include "adapters/CC_CallAdapter.h"
#include "calls/CC_Monitor.h"
#include "platform/base/TYLifeline.h"

/// The log for a line of an adapter. Naming the endpoint is the module's code and may end the adapter: then no line is
/// wanted any more.
///
///     if (Log const log(*this, RTD::LEVEL_FLOW); log.isWanted())
///         log->debug("[EP %s/%s] ...", log.getEndpointName(), m_name.c_str());
class CC_CallAdapter::Log
{
public:
    Log(CC_CallAdapter const& adapter, RTD::Level level) : m_monitor(CC_Monitor::FOR(level))
    {
        if (m_monitor == nullptr)
            return;
        TYLifeline::Watch const self(adapter.m_lifeline);
        m_endpointName = adapter.getEndpointName();
        if (!self.isAlive())
            m_monitor = nullptr;
    }
    bool isWanted() const { return m_monitor != nullptr; }
    RTD::Monitor const* operator->() const { return m_monitor; }
    char const* getEndpointName() const { return m_endpointName; }

private:
    RTD::Monitor const* m_monitor;
    char const* m_endpointName = "";
};
