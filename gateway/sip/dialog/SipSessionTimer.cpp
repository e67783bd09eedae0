#include "sip/dialog/SipSessionTimer.h"

#include <algorithm>

namespace
{
constexpr unsigned int LEAST_OF_ALL = 90; // seconds; RFC 4028, 5: what goes without saying
constexpr unsigned int LONGEST_MARGIN = 32;
} // namespace

bool SipSessionTimer::takeRequest(Seen const& seen)
{
    if (seen.interval != 0 && seen.interval < m_least && seen.isSupported)
        return false;
    m_leastOfPeer = std::max(m_leastOfPeer, seen.least);
    unsigned int const wanted = std::max(m_wanted, m_wanted != 0 ? m_leastOfPeer : 0);
    if (seen.interval == 0)
        m_interval = m_interval != 0 ? m_interval : wanted;
    else
        m_interval = wanted != 0 ? std::min(seen.interval, wanted) : seen.interval;
    m_isOurs = !seen.isSupported || seen.refresher == UAS;
    m_isMissed = false;
    return true;
}

void SipSessionTimer::takeResponse(Seen const& seen)
{
    m_interval = seen.interval != 0 ? seen.interval : std::max(m_wanted, m_interval);
    m_isOurs = seen.interval == 0 || seen.refresher != UAS;
    m_isMissed = false;
}

bool SipSessionTimer::raise(unsigned int least)
{
    unsigned int& interval = m_interval != 0 ? m_interval : m_wanted;
    if (least <= interval)
        return false;
    interval = least;
    m_leastOfPeer = std::max(m_leastOfPeer, least);
    return true;
}

std::string SipSessionTimer::getRequestHeaders() const
{
    unsigned int const interval = m_interval != 0 ? m_interval : m_wanted;
    if (interval == 0)
        return {};
    std::string headers = "Session-Expires: " + std::to_string(interval);
    if (m_interval != 0)
        headers += m_isOurs ? ";refresher=uac" : ";refresher=uas";
    unsigned int const least = std::max(m_least, m_leastOfPeer);
    return headers + "\r\n" + (least > LEAST_OF_ALL ? "Min-SE: " + std::to_string(least) + "\r\n" : "");
}

std::string SipSessionTimer::getResponseHeaders() const
{
    if (m_interval == 0)
        return {};
    return "Session-Expires: " + std::to_string(m_interval) +
           (m_isOurs ? ";refresher=uas\r\n" : ";refresher=uac\r\nRequire: timer\r\n");
}

std::string SipSessionTimer::getMinimum() const { return "Min-SE: " + std::to_string(m_least) + "\r\n"; }

unsigned int SipSessionTimer::getDelay() const
{
    return m_isOurs ? m_interval * 500 : (m_interval - std::min(LONGEST_MARGIN, m_interval / 3)) * 1000;
}
