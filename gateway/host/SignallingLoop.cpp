#include "host/SignallingLoop.h"

#include "platform/eventloop/TYEventLoop.h"

void SignallingLoop::attach(TYEventLoop& loop)
{
    watch(loop.getPollFd(), [&loop] { loop.runTurn(); });
}
