#include "sip/access/SipReflection.h"

#include "platform/base/TYTime.h"

#include <algorithm>

namespace
{
long SECONDS_NOW() { return static_cast<long>(TY::Time::NOW(TY::Time::MONOTONIC).seconds); }
} // namespace

bool SipReflection::admit(InternetAddress const& source, std::size_t octetsOfRequest, std::size_t octetsOfAnswer)
{
    long const now = SECONDS_NOW();
    Record& record = find(source, now);
    record.received += octetsOfRequest;
    bool const isAdmitted = now < record.reached || record.sent + octetsOfAnswer <= std::max(CREDIT, record.received);
    if (isAdmitted)
        record.sent += octetsOfAnswer;
    else
        ++m_heldBack;
    return isAdmitted;
}

void SipReflection::noteReached(InternetAddress const& source)
{
    long const now = SECONDS_NOW();
    find(source, now).reached = now + MEMORY;
}

SipReflection::Record& SipReflection::find(InternetAddress const& source, long now)
{
    Record& record = m_records.use(source);
    if (now - record.last > MEMORY)
        record = {};
    record.last = now;
    return record;
}
