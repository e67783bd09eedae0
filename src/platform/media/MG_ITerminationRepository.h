#pragma once

#include "platform/base/Export.h"
#include "platform/base/TYCounted.h"

/// The media layer's terminations (the ends of media streams). Call control keeps the repository for the modules and
/// asks nothing of it itself.
class CC_EXPORT MG_ITerminationRepository : public TYCounted
{
public:
    ~MG_ITerminationRepository() override;
};
