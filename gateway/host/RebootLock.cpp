#include "host/RebootLock.h"

#include <spdlog/spdlog.h>

XCode RebootLock::addGracefulLock(String const& owner, String const& reason, int)
{
    ++m_locks;
    spdlog::debug("reload lock taken by {}: {}", owner.view(), reason.view());
    return XCode::OK;
}

XCode RebootLock::releaseGracefulLock(String const& owner)
{
    if (m_locks == 0)
        return XCode::REFUSED;
    --m_locks;
    spdlog::debug("reload lock given back by {}", owner.view());
    return XCode::OK;
}
