#pragma once

#include <functional>

/// Whoever waits for descriptors on the signalling thread: the process's outermost loop.
class IsdnWatch
{
public:
    virtual ~IsdnWatch() = default;
    /// Calls `onReadable` whenever the descriptor is readable, until `unwatch`, which may be called inside.
    virtual void watch(int descriptor, std::function<void()> onReadable) = 0;
    virtual void unwatch(int descriptor) = 0;
};
