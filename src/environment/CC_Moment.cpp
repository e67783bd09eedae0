#include "environment/CC_Moment.h"

#include "environment/CC_Environment.h"
#include "platform/eventloop/TYEventLoop.h"

CC_Moment CC_Moment::NOW()
{
    TYEventLoop* const loop = CC_Environment::CC_EVENT_LOOP();
    return loop != nullptr ? CC_Moment{loop->getNumberOfTurns(), loop->getTime()} : CC_Moment();
}
