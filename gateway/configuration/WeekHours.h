#pragma once

#include <bitset>
#include <ctime>
#include <string>
#include <vector>

/// Hours of some days of the week, such as Monday to Friday from 08:00 to 18:00, or Saturday from 22:00 to 06:00 of the
/// day after. A plain value; at first it is always.
///
///     if (WeekHours::PARSE({"mon", "tue"}, "08:00-18:00").contains(WeekHours::MINUTE_OF(std::time(nullptr))))
///         ...
class WeekHours
{
public:
    static constexpr unsigned int MINUTES_OF_DAY = 24 * 60;

    /// Days are "mon" to "sun", none are all of them; hours are "HH:MM-HH:MM", from the first to before the second,
    /// both the same or empty: the whole day. Throws std::invalid_argument with the reason for anything else.
    static WeekHours PARSE(std::vector<std::string> const& days, std::string const& hours);
    /// Of the week, which begins with Monday, on the clock of where we are.
    static unsigned int MINUTE_OF(std::time_t time);

    bool contains(unsigned int minuteOfWeek) const;

    friend bool operator==(WeekHours const&, WeekHours const&) = default;

private:
    std::bitset<7> m_days{0x7f};
    unsigned int m_first = 0; // minutes of the day
    unsigned int m_end = 0;
};
