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
    Record& record = find(party);
    if (now - std::max(record.last, record.until) > LONGEST)
        record = {};
    record.last = now;
    if (++record.failures < PATIENCE)
        return 0;
    record.failures = 0;
    record.ban = record.ban == 0 ? FIRST : std::min(2 * record.ban, LONGEST);
    record.until = now + record.ban;
    long const ban = record.ban;
    if (m_banned.find(party) == nullptr)
    {
        m_banned.use(party) = record;
        m_failing.erase(party);
    }
    return ban;
}

SipBans::Record& SipBans::find(InternetAddress const& party)
{
    return m_banned.find(party) != nullptr ? m_banned.use(party) : m_failing.use(party);
}

bool SipBans::isBanned(InternetAddress const& source) const
{
    if (m_banned.getSize() == 0)
        return false;
    Record const* const record = m_banned.find(PARTY_OF(source));
    return record != nullptr && NOW() < record->until;
}

std::size_t SipBans::getNumberOfBanned() const
{
    long const now = NOW();
    return static_cast<std::size_t>(
        std::count_if(m_banned.begin(), m_banned.end(), [&](auto const& entry) { return now < entry.second.until; }));
}
