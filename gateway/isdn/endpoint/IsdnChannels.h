#pragma once

#include "isdn/line/IsdnLine.h"

#include <bitset>

/// Which B channels of a line are taken (Q.931, 5.1.2 and 5.2.3). The two sides begin at opposite ends, so that they
/// seldom take the same one at once.
class IsdnChannels
{
public:
    static constexpr unsigned int NONE = 0;
    using Set = std::bitset<IsdnLine::LAST_TIMESLOT + 1>;

    IsdnChannels(Set const& inService, bool isNetwork) : m_free(inService), m_isNetwork(isNetwork)
    {
        m_free.reset(0).reset(IsdnLine::D_TIMESLOT);
        m_inService = m_free;
    }

    /// Any free one; NONE when there is none.
    unsigned int take();
    /// That one: whether it was free.
    bool take(unsigned int timeslot);
    /// Nothing happens for NONE.
    void giveBack(unsigned int timeslot);
    bool isFree(unsigned int timeslot) const { return timeslot < m_free.size() && m_free[timeslot]; }
    unsigned int getNumberOfFree() const { return static_cast<unsigned int>(m_free.count()); }

private:
    Set m_free;
    Set m_inService;
    bool m_isNetwork;
};
