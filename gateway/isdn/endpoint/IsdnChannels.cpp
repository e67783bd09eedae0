#include "isdn/endpoint/IsdnChannels.h"

unsigned int IsdnChannels::take()
{
    for (unsigned int i = 1; i <= IsdnLine::LAST_TIMESLOT; ++i)
        if (unsigned int const timeslot = m_isNetwork ? IsdnLine::LAST_TIMESLOT + 1 - i : i; take(timeslot))
            return timeslot;
    return NONE;
}

bool IsdnChannels::take(unsigned int timeslot)
{
    if (!isFree(timeslot))
        return false;
    m_free.reset(timeslot);
    return true;
}

void IsdnChannels::giveBack(unsigned int timeslot)
{
    if (timeslot < m_free.size())
        m_free[timeslot] = m_inService[timeslot];
}
