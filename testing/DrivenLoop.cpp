#include "testing/DrivenLoop.h"

#include "callcontrol/CallControl.h"

DrivenLoop::DrivenLoop() : m_before(CallControl::GET_CC_EVENT_LOOP()) { CallControl::SET_CC_EVENT_LOOP(this); }

DrivenLoop::~DrivenLoop()
{
    if (CallControl::GET_CC_EVENT_LOOP() == this)
        CallControl::SET_CC_EVENT_LOOP(m_before);
}

unsigned int DrivenLoop::settle(unsigned int bound)
{
    unsigned int turns = 0;
    while (turns < bound && turn())
        ++turns;
    return turns;
}
