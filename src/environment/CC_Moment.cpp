#include "environment/CC_Moment.h"

#include "environment/CC_Environment.h"
#include "platform/eventloop/TYEventLoop.h"

CC_Moment CC_Moment::NOW()
{
    TYEventLoop* const loop = CC_Environment::CC_EVENT_LOOP();
    if (loop == nullptr)
        return {};
    long long const time = loop->getTime();
    return {loop->getNumberOfTurns(), time};
}
