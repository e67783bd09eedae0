#include "sip/access/SipRequestRate.h"

#include "platform/base/TYTime.h"

#include <spdlog/spdlog.h>

#include <utility>

bool SipRequestRate::admit(InternetAddress const& address)
{
    if (m_perSecond == 0)
        return true;
    Source& source = m_sources.use(address);
    source.rate.setLimit(m_perSecond);
    if (source.rate.take())
        return true;
    ++m_refused;
    ++source.refused;
    complain(address, source);
    return false;
}

void SipRequestRate::complain(InternetAddress const& address, Source& source) const
{
    long const now = static_cast<long>(TY::Time::NOW(TY::Time::MONOTONIC).seconds);
    if (now - source.told < BETWEEN_WORDS)
        return;
    source.told = now;
    spdlog::warn("interface {}: {} sends more than {} requests a second, {} were dropped", m_interface,
                 AddressRange::TEXT_OF(address), m_perSecond, std::exchange(source.refused, 0));
}
