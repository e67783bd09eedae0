#include "sip/access/SipBans.h"

#include "platform/base/TYTime.h"

#include <algorithm>

namespace
{
long NOW() { return static_cast<long>(TY::Time::NOW(TY::Time::MONOTONIC).seconds); }

InternetAddress PARTY_OF(InternetAddress address)
{
    bool const isVersion4 = std::all_of(address.begin(), address.begin() + 10, [](unsigned char c) { return c == 0; });
    if (!isVersion4)
        std::fill(address.begin() + 8, address.end(), static_cast<unsigned char>(0));
    return address;
}
} // namespace

long SipBans::note(InternetAddress const& source)
{
    long const now = NOW();
    InternetAddress const party = PARTY_OF(source);
    if (m_records.size() >= m_most && !m_records.contains(party))
        makeRoom(now);
    Record& record = m_records[party];
    if (now - std::max(record.last, record.until) > LONGEST)
        record = {};
    record.last = now;
    if (++record.failures < PATIENCE)
        return 0;
    record.failures = 0;
    record.ban = record.ban == 0 ? FIRST : std::min(2 * record.ban, LONGEST);
    record.until = now + record.ban;
    return record.ban;
}

bool SipBans::isBanned(InternetAddress const& source) const
{
    if (m_records.empty())
        return false;
    auto const found = m_records.find(PARTY_OF(source));
    return found != m_records.end() && NOW() < found->second.until;
}

std::size_t SipBans::getNumberOfBanned() const
{
    long const now = NOW();
    return static_cast<std::size_t>(
        std::count_if(m_records.begin(), m_records.end(), [&](auto const& entry) { return now < entry.second.until; }));
}

/// One who is banned stays as long as there is another.
void SipBans::makeRoom(long now)
{
    auto const isBefore = [&](auto const& one, auto const& other)
    {
        bool const isOneBanned = now < one.second.until;
        bool const isOtherBanned = now < other.second.until;
        return isOneBanned != isOtherBanned ? isOtherBanned : one.second.last < other.second.last;
    };
    m_records.erase(std::min_element(m_records.begin(), m_records.end(), isBefore));
}
