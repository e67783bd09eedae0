#include "host/SignallingLoop.h"

#include "host/TurnTime.h"
#include "platform/eventloop/TYEventLoop.h"

void SignallingLoop::attach(TYEventLoop& loop)
{
    m_attached.reserve(m_attached.size() + 1);
    watch(loop.getPollFd(), [&loop] { loop.runTurn(); });
    m_attached.push_back(&loop);
}

void SignallingLoop::beginBusy()
{
    for (TYEventLoop* const loop : m_attached)
        loop->beginBusy();
}

void SignallingLoop::endBusy()
{
    for (TYEventLoop* const loop : m_attached)
        loop->endBusy();
    if (m_turnTime != nullptr)
        m_turnTime->note();
}
