#include "media/rtp/RtpLatch.h"

void RtpLatch::expect(DatagramAddress const& described)
{
    if (described.length == m_described.length && described == m_described)
        return;
    m_described = m_target = described;
    m_hasLearned = m_isSettled = false;
}

bool RtpLatch::learn(DatagramAddress const& from, long long now)
{
    if (m_isSettled)
        return false;
    if (m_described.isSomewhere() && from == m_described)
    {
        m_target = from;
        m_isSettled = true;
        return true;
    }
    if (!m_hasLearned)
    {
        m_target = from;
        m_firstPacket = now;
        m_hasLearned = true;
        return true;
    }
    m_isSettled = now - m_firstPacket > m_window;
    return from == m_target;
}
