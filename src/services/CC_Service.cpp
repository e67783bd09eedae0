#include "services/CC_Service.h"

namespace
{
unsigned int s_nextType = 0;
} // namespace

CC_Service::~CC_Service() = default;

unsigned int CC_Service::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}

unsigned int CC_Service::ACQUIRE_TYPE() { return s_nextType++; }
