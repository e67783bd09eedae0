#include "host/Routing.h"

#include <algorithm>
#include <set>

namespace
{
constexpr char WHOLE = '\n'; // no number has a line break, nor has the name of an interface

std::string KEY_OF(std::string_view from, std::string_view prefix)
{
    std::string key;
    key.reserve(from.size() + prefix.size() + 2);
    return key.append(from).append(1, '\n').append(prefix);
}

bool IS_FOR_CALLER(Route const& route, Routing::Question const& question)
{
    return question.calling.substr(0, route.calling.size()) == route.calling;
}

bool IS_FOR_USER(Route const& route, Routing::Question const& question)
{
    return route.user.empty() || route.user == question.user;
}

char const* WHY_NOT(Route const& route, Routing::Question const& question)
{
    if (!IS_FOR_CALLER(route, question))
        return " (not taken: it is for other callers)";
    return IS_FOR_USER(route, question) ? " (not taken: it is for other hours)"
                                        : " (not taken: it is for another user)";
}

bool FITS(Route const& route, Routing::Question const& question)
{
    return IS_FOR_CALLER(route, question) && IS_FOR_USER(route, question) &&
           route.hours.contains(question.minuteOfWeek);
}

unsigned int WEIGHT_OF(Routing::Choices::const_iterator first, Routing::Choices::const_iterator end)
{
    unsigned int weight = 0;
    for (; first != end; ++first)
        weight += (*first)->weight;
    return weight;
}

/// Numbers that follow each other, or every second one, become numbers that do not.
unsigned int SPREAD(unsigned int number) { return (number * 2654435761u) >> 12; }

/// Of routes for the same, one by its weight comes first; the others stay as they are listed.
void CHOOSE(Routing::Choices::iterator first, Routing::Choices::iterator end, unsigned int chance)
{
    unsigned int const weight = WEIGHT_OF(first, end);
    if (weight == 0)
        return; // the first one listed
    unsigned int left = SPREAD(chance) % weight;
    Routing::Choices::iterator chosen = first;
    for (; left >= (*chosen)->weight; ++chosen)
        left -= (*chosen)->weight;
    std::rotate(first, chosen, chosen + 1);
}

std::string DESCRIBE(Route const& route, Routing::Question const& question)
{
    std::string text = std::string(question.number) + " from " + route.from +
                       (route.isWhole ? ": number \"" : ": prefix \"") + route.prefix + "\" to " + route.to;
    if (route.isShaping())
        text += " as " + route.shape(question.number);
    if (route.maxCalls != 0)
        text += ", " + std::to_string(route.maxCalls) + " calls at most";
    if (route.maxCallsPerSecond != 0)
        text += ", " + std::to_string(route.maxCallsPerSecond) + " a second at most";
    return text + (route.isEmergency ? ", an emergency number" : "");
}

std::string LIST(std::vector<unsigned int> const& causes)
{
    std::string text;
    for (unsigned int const cause : causes)
        text += (text.empty() ? "" : ", ") + std::to_string(cause);
    return text;
}

std::string WHY_NOT_FIRST(Routing::Choices const& before, bool isForSame)
{
    Route const& last = *before.back();
    if (!last.nextOn.empty())
        return std::string(" (tried when that ") + (last.isLimited() ? "is full, or " : "") + "ends with cause " +
               LIST(last.nextOn) + ")";
    if (last.isLimited())
        return " (tried when that is full)";
    return isForSame ? " (not taken: another one for the same is)" : " (not taken: a longer one fits)";
}
} // namespace

Routing::Routing(std::vector<Route> const& routes, Routing const* before)
{
    std::set<std::size_t, std::greater<>> lengths;
    m_routes.reserve(routes.size());
    for (Route const& route : routes)
    {
        std::string key = KEY_OF(route.from, route.prefix);
        if (route.isWhole)
            key += WHOLE;
        else
            lengths.insert(route.prefix.size());
        m_hasEmergency = m_hasEmergency || route.isEmergency;
        std::shared_ptr<RouteLoad> load = before != nullptr ? before->findLoad(key, route) : nullptr;
        if (load == nullptr && route.isLimited())
            load = std::make_shared<RouteLoad>(0, 0);
        if (load != nullptr)
            load->setLimits(route.maxCalls, route.maxCallsPerSecond);
        m_routes[std::move(key)].push_back(std::make_shared<Entry const>(Entry{route, std::move(load)}));
    }
    m_lengths.assign(lengths.begin(), lengths.end());
    for (auto const& [key, choices] : m_routes)
        m_keys.push_back(key);
    std::sort(m_keys.begin(), m_keys.end());
}

/// Of the same route; one that has no limit any more has none, but its calls may be under one later.
std::shared_ptr<RouteLoad> Routing::findLoad(std::string const& key, Route const& route) const
{
    auto const found = m_routes.find(std::string_view(key));
    if (found == m_routes.end())
        return nullptr;
    for (std::shared_ptr<Entry const> const& entry : found->second)
        if (entry->to == route.to && entry->calling == route.calling && entry->user == route.user)
            return entry->load;
    return nullptr;
}

template <class Take>
void Routing::forEach(Question const& question, Take&& take) const
{
    std::string const key = KEY_OF(question.from, question.number) + WHOLE;
    if (auto const whole = m_routes.find(key); whole != m_routes.end())
        take(whole->second);
    for (std::size_t const length : m_lengths)
    {
        if (length > question.number.size())
            continue;
        auto const found = m_routes.find(std::string_view(key).substr(0, question.from.size() + 1 + length));
        if (found != m_routes.end())
            take(found->second);
    }
}

Routing::Choices Routing::find(Question const& question) const
{
    Choices choices;
    forEach(question,
            [&](Choices const& routes)
            {
                std::size_t const before = choices.size();
                for (std::shared_ptr<Entry const> const& route : routes)
                    if (FITS(*route, question))
                        choices.push_back(route);
                CHOOSE(choices.begin() + static_cast<std::ptrdiff_t>(before), choices.end(), question.chance);
            });
    return choices;
}

bool Routing::isBeginning(std::string_view from, std::string_view number) const
{
    std::string const key = KEY_OF(from, number);
    auto const next = std::lower_bound(m_keys.begin(), m_keys.end(), key);
    return next != m_keys.end() && next->starts_with(key);
}

bool Routing::isEmergency(std::string_view from, std::string_view number) const
{
    if (!m_hasEmergency)
        return false;
    Choices const* first = nullptr;
    forEach({from, number}, [&](Choices const& routes) { first = first != nullptr ? first : &routes; });
    return first != nullptr &&
           std::any_of(first->begin(), first->end(), [](auto const& route) { return route->isEmergency; });
}

std::vector<std::string> Routing::explain(Question const& question) const
{
    std::vector<std::string> lines;
    Choices const choices = find(question);
    for (std::size_t i = 0; i < choices.size(); ++i)
    {
        Choices const before(choices.begin(), choices.begin() + static_cast<std::ptrdiff_t>(i));
        lines.push_back(DESCRIBE(*choices[i], question) +
                        (i == 0 ? "" : WHY_NOT_FIRST(before, choices[i]->prefix == before.back()->prefix)));
    }
    forEach(question,
            [&](Choices const& routes)
            {
                for (std::shared_ptr<Entry const> const& route : routes)
                    if (!FITS(*route, question))
                        lines.push_back(DESCRIBE(*route, question) + WHY_NOT(*route, question));
            });
    return lines;
}
