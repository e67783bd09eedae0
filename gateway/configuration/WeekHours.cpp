#include "configuration/WeekHours.h"

#include <algorithm>
#include <array>
#include <stdexcept>
#include <string_view>

namespace
{
constexpr std::array<std::string_view, 7> DAYS{"mon", "tue", "wed", "thu", "fri", "sat", "sun"};

unsigned int NUMBER_OF(std::string_view twoDigits)
{
    for (char const digit : twoDigits)
        if (digit < '0' || digit > '9')
            throw std::invalid_argument("expected hours as \"08:00-18:00\"");
    return static_cast<unsigned int>(twoDigits[0] - '0') * 10 + static_cast<unsigned int>(twoDigits[1] - '0');
}

/// Of "HH:MM".
unsigned int MINUTE_OF_DAY(std::string_view text)
{
    unsigned int const minute = NUMBER_OF(text.substr(0, 2)) * 60 + NUMBER_OF(text.substr(3, 2));
    if (text[2] != ':' || NUMBER_OF(text.substr(3, 2)) > 59 || minute > WeekHours::MINUTES_OF_DAY)
        throw std::invalid_argument("expected hours from 00:00 to 24:00");
    return minute;
}
} // namespace

WeekHours WeekHours::PARSE(std::vector<std::string> const& days, std::string const& hours)
{
    WeekHours result;
    if (!days.empty())
        result.m_days.reset();
    for (std::string const& day : days)
    {
        auto const found = std::find(DAYS.begin(), DAYS.end(), day);
        if (found == DAYS.end())
            throw std::invalid_argument("days are mon, tue, wed, thu, fri, sat, sun");
        result.m_days.set(static_cast<std::size_t>(found - DAYS.begin()));
    }
    if (hours.empty())
        return result;
    if (hours.size() != 11 || hours[5] != '-')
        throw std::invalid_argument("expected hours as \"08:00-18:00\"");
    result.m_first = MINUTE_OF_DAY(std::string_view(hours).substr(0, 5)) % MINUTES_OF_DAY;
    result.m_end = MINUTE_OF_DAY(std::string_view(hours).substr(6)) % MINUTES_OF_DAY;
    return result;
}

unsigned int WeekHours::MINUTE_OF(std::time_t time)
{
    std::tm local{};
    localtime_r(&time, &local);
    auto const day = static_cast<unsigned int>(local.tm_wday + 6) % 7;
    return day * MINUTES_OF_DAY + static_cast<unsigned int>(local.tm_hour * 60 + local.tm_min);
}

bool WeekHours::contains(unsigned int minuteOfWeek) const
{
    unsigned int const day = minuteOfWeek / MINUTES_OF_DAY % 7;
    unsigned int const minute = minuteOfWeek % MINUTES_OF_DAY;
    if (m_first < m_end)
        return m_days[day] && minute >= m_first && minute < m_end;
    // to the day after, or all day
    return (m_days[day] && minute >= m_first) || (m_days[(day + 6) % 7] && minute < m_end);
}
