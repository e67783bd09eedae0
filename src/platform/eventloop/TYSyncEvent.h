#pragma once

#include "platform/base/Export.h"
#include "platform/base/XCode.h"
#include "platform/eventloop/TYEvent.h"

#include <memory>
#include <type_traits>

/// Runs a function on an event loop's thread while the caller waits: how other threads enter call control.
///
/// Each loop keeps one for each priority (`TYEventLoop::getSyncEvent`); any number of threads may use it at once.
///
///     unsigned int calls = 0;
///     std::ignore = CallControl::GET_CC_SYNC_EVENT(EventPrio::NORMAL)
///                       .execute([&] { calls = CallControl::GET_NUMBER_OF_CALLS(); });
class CC_EXPORT TYSyncEvent
{
public:
    /// Blocks until the loop has run `function()` in its place among the events of this priority; on the loop's own
    /// thread it runs at once (whoever made a loop for another thread is taken for it until that thread runs it). OK;
    /// FAILURE when the loop was destroyed before it came to it; NO_ELEMENT when memory is out. Unless OK the function
    /// has not run and never will. A loop that has stopped keeps the caller waiting until it runs again or is
    /// destroyed. The function must not throw.
    template <class Function>
    XCode execute(Function&& function)
    {
        using Plain = std::remove_reference_t<Function>;
        return run([](void* argument) { (*static_cast<Plain*>(argument))(); },
                   const_cast<void*>(static_cast<void const*>(std::addressof(function))));
    }

private:
    friend class TYEventLoop;
    TYSyncEvent() = default;
    XCode run(TYEvent::Callback function, void* argument);

    TYEventLoop* m_loop = nullptr;
    EventPrio::Type m_priority = EventPrio::HIGHEST;
};
