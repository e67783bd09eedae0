#include "media/context/Bridge.h"

#include "media/rtp/RtpTermination.h"

#include <algorithm>

void Bridge::add(RtpTermination& leg)
{
    m_legs.push_back(&leg);
    connect();
}

void Bridge::remove(RtpTermination& leg)
{
    leg.setPartner(nullptr);
    std::erase(m_legs, &leg);
    connect();
}

void Bridge::connect()
{
    bool const arePartners = m_legs.size() == 2;
    for (RtpTermination* const leg : m_legs)
        leg->setPartner(arePartners ? m_legs[leg == m_legs[0] ? 1 : 0] : nullptr);
}

void Bridge::tick(long long now)
{
    for (RtpTermination* const leg : m_legs)
    {
        if (leg->isClocked())
            leg->tick(now);
    }
}
