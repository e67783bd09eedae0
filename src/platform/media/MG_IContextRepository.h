#pragma once

#include "platform/base/Export.h"
#include "platform/base/TYCounted.h"
#include "platform/base/TYPtr.h"
#include "platform/base/XCode.h"
#include "platform/media/MG_IContext.h"

/// Makes the media layer's contexts. Implemented by the media layer, handed to call control by the application
/// (`CallControl::SET_MG_CONTEXT_REPOSITORY`).
class CC_EXPORT MG_IContextRepository : public TYCounted
{
public:
    ~MG_IContextRepository() override;
    /// Fills `context` with a new context. A failure leaves it as it was; the codes are the media layer's.
    virtual XCode createContext(TYPtr<MG_IContext>& context) = 0;
};
