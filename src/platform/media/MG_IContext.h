#pragma once

#include "platform/base/Export.h"
#include "platform/base/TYCounted.h"

/// One context of the media layer: the place where the media streams of a call meet. Implemented by the media layer,
/// which shares it with the calls by reference count.
class CC_EXPORT MG_IContext : public TYCounted
{
public:
    ~MG_IContext() override;
    /// The context's own id, as the media layer numbers it.
    virtual unsigned int getId() const = 0;
};
