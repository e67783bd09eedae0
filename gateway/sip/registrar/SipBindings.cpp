#include "sip/registrar/SipBindings.h"

#include "platform/base/TYTime.h"

#include <algorithm>

namespace
{
bool IS_LATE(SipBinding const& binding, std::string const& callId, std::uint32_t sequence)
{
    return binding.callId == callId && sequence <= binding.sequence;
}
} // namespace

long long SipBindings::NOW() { return TY::Time::NOW(TY::Time::REALTIME).seconds; }

SipBindings::Result SipBindings::update(std::string const& user, std::vector<Wish> const& wishes,
                                        std::string const& callId, std::uint32_t sequence)
{
    std::vector<SipBinding> bindings = find(user);
    bool isNews = false;
    for (Wish const& wish : wishes)
    {
        auto const found = std::find_if(bindings.begin(), bindings.end(),
                                        [&](SipBinding const& binding) { return binding.uri == wish.uri; });
        if (found != bindings.end() && IS_LATE(*found, callId, sequence))
            return OUT_OF_ORDER;
        isNews = isNews || found == bindings.end() || wish.seconds == 0 || found->called != wish.called ||
                 found->route != wish.route;
        if (found != bindings.end())
            bindings.erase(found);
        if (wish.seconds != 0)
            bindings.insert(bindings.begin(), {wish.uri, callId, sequence, wish.preference, NOW() + wish.seconds,
                                               wish.called, wish.route});
    }
    if (bindings.size() > m_mostOfUser)
        return TOO_MANY;
    m_users[user] = std::move(bindings);
    return isNews ? OK : REFRESHED;
}

SipBindings::Result SipBindings::clear(std::string const& user, std::string const& callId, std::uint32_t sequence)
{
    std::vector<SipBinding> const bindings = find(user);
    if (std::any_of(bindings.begin(), bindings.end(),
                    [&](SipBinding const& binding) { return IS_LATE(binding, callId, sequence); }))
        return OUT_OF_ORDER;
    m_users.erase(user);
    return OK;
}

std::vector<SipBinding> SipBindings::find(std::string_view user) const
{
    auto const found = m_users.find(user);
    if (found == m_users.end())
        return {};
    std::vector<SipBinding> bindings = found->second;
    std::erase_if(bindings, [now = NOW()](SipBinding const& binding) { return binding.until <= now; });
    std::stable_sort(bindings.begin(), bindings.end(),
                     [](SipBinding const& one, SipBinding const& other) { return one.preference > other.preference; });
    return bindings;
}

std::size_t SipBindings::getNumber() const
{
    std::size_t number = 0;
    for (auto const& [user, bindings] : m_users)
        number += static_cast<std::size_t>(std::count_if(bindings.begin(), bindings.end(),
                                                         [now = NOW()](SipBinding const& binding)
                                                         { return binding.until > now; }));
    return number;
}
