#pragma once

#include "platform/base/Export.h"
#include "platform/base/TYPtr.h"
#include "platform/media/MG_IContextRepository.h"
#include "platform/media/MG_ITerminationRepository.h"

class TYEventLoop;

/// What the application gives call control at its start: the two event loops, which it owns, and the media layer's
/// repositories, on which a counted reference is held.
///
/// The application sets them through CallControl, whose first member this is. Below CallControl, calls and properties
/// read what they need here: so no folder includes one above it.
struct CC_EXPORT CC_Environment
{
    /// Null until set. @{
    TYEventLoop* m_ccEventLoop = nullptr;
    TYEventLoop* m_dpEventLoop = nullptr;
    TYPtr<MG_IContextRepository> m_mgContextRepository;
    TYPtr<MG_ITerminationRepository> m_mgTerminationRepository;
    /// @}

    /// Those of the one CallControl; null before it was made, and as long as the application has not set them. @{
    static TYEventLoop* CC_EVENT_LOOP() { return s_current != nullptr ? s_current->m_ccEventLoop : nullptr; }
    static MG_IContextRepository* MG_CONTEXT_REPOSITORY()
    {
        return s_current != nullptr ? s_current->m_mgContextRepository.get() : nullptr;
    }
    /// @}

    /// CallControl's business.
    static CC_Environment const* s_current;
};
