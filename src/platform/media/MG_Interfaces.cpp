#include "platform/media/MG_IContext.h"
#include "platform/media/MG_IContextRepository.h"
#include "platform/media/MG_ITerminationRepository.h"

// One home for the type information of the interfaces, which casts across shared objects rely on.
MG_IContext::~MG_IContext() = default;
MG_IContextRepository::~MG_IContextRepository() = default;
MG_ITerminationRepository::~MG_ITerminationRepository() = default;
