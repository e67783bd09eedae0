#pragma once

#include "platform/base/Export.h"

#include <atomic>

/// The base of an object that lives as long as somebody holds a reference on it. Born with none (a TYPtr takes the
/// first); the count is atomic, so references may be given up on any thread.
class CC_EXPORT TYCounted
{
public:
    TYCounted() = default;
    TYCounted(TYCounted const&) = delete;
    TYCounted& operator=(TYCounted const&) = delete;

    /// From any thread; giving up the last reference deletes the object there. @{
    void addReference() const { m_references.fetch_add(1, std::memory_order_relaxed); }
    void removeReference() const
    {
        if (m_references.fetch_sub(1, std::memory_order_acq_rel) == 1)
            delete this;
    }
    /// @}

    /// Whether somebody besides the caller, who holds a reference, holds one, too.
    bool isShared() const { return m_references.load(std::memory_order_acquire) > 1; }

protected:
    virtual ~TYCounted() = default;

private:
    mutable std::atomic<int> m_references{0};
};
