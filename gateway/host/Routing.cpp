#include "host/Routing.h"

#include <algorithm>
#include <set>

namespace
{
/// No name of an interface has a line break.
std::string KEY_OF(std::string_view from, std::string_view prefix)
{
    std::string key;
    key.reserve(from.size() + 1 + prefix.size());
    return key.append(from).append(1, '\n').append(prefix);
}
} // namespace

Routing::Routing(std::vector<Configuration::Route> const& routes)
{
    std::set<std::size_t, std::greater<>> lengths;
    m_targets.reserve(routes.size());
    for (Configuration::Route const& route : routes)
    {
        m_targets.try_emplace(KEY_OF(route.from, route.prefix), route.to);
        lengths.insert(route.prefix.size());
    }
    m_lengths.assign(lengths.begin(), lengths.end());
}

template <class Take>
void Routing::forEach(std::string_view from, std::string_view number, Take&& take) const
{
    std::string const whole = KEY_OF(from, number);
    for (std::size_t const length : m_lengths)
    {
        if (length > number.size())
            continue;
        auto const found = m_targets.find(std::string_view(whole).substr(0, from.size() + 1 + length));
        if (found != m_targets.end() && take(number.substr(0, length), found->second))
            return;
    }
}

std::string const* Routing::find(std::string_view from, std::string_view number) const
{
    std::string const* result = nullptr;
    forEach(from, number,
            [&](std::string_view, std::string const& to)
            {
                result = &to;
                return true;
            });
    return result;
}

bool Routing::isBeginning(std::string_view from, std::string_view number) const
{
    std::string const key = KEY_OF(from, number);
    return std::any_of(m_targets.begin(), m_targets.end(),
                       [&](auto const& target) { return target.first.starts_with(key); });
}

std::vector<Routing::Match> Routing::findAll(std::string_view from, std::string_view number) const
{
    std::vector<Match> matches;
    forEach(from, number,
            [&](std::string_view prefix, std::string const& to)
            {
                matches.push_back({prefix, to});
                return false;
            });
    return matches;
}
