// What a recording tells of whole calls: ladders and the list.
#include "diagnosis/CC_RecordingReport.h"

#include "diagnosis/CC_BriefText.h"
#include "diagnosis/CC_JsonLine.h"
#include "platform/signalling/QCause.h"
#include "properties/CC_PropertyId.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>

using namespace CC_RecordFormat;

namespace
{
using Event = CC_Recording::Event;

constexpr std::size_t COLUMN_WIDTH = 28;

/// Unsigned in between, since the times of a damaged recording may be any.
double NANOSECONDS_BETWEEN(long long earlier, long long later)
{
    return static_cast<double>(
        static_cast<long long>(static_cast<unsigned long long>(later) - static_cast<unsigned long long>(earlier)));
}

bool CONTAINS(std::vector<std::uint64_t> const& list, std::uint64_t serial)
{
    return std::find(list.begin(), list.end(), serial) != list.end();
}

std::string PADDED(std::string text, std::size_t width)
{
    text.resize(std::max(text.size() + 1, width), ' ');
    return text;
}

/// The legs that were ever in the call, in the order in which they came.
std::vector<std::uint64_t> LEGS_OF(std::uint64_t call, std::vector<Event> const& events)
{
    std::vector<std::uint64_t> legs;
    for (Event const& event : events)
        if (event.record.call == call && event.record.leg != 0 && !CONTAINS(legs, event.record.leg))
            legs.push_back(event.record.leg);
    return legs;
}

/// That a leg has moved between a call and none follows from its joining or leaving.
bool IS_SAID_ALREADY(Event const& event)
{
    return event.record.kind == Kind::LEG_MOVED && (event.record.call == 0 || event.number == 0);
}

std::string TIME_AND_TURN(Event const& event, long long start)
{
    std::array<char, 64> text;
    std::snprintf(text.data(), text.size(), "%11.3f %7u  ", NANOSECONDS_BETWEEN(start, event.record.nanoseconds) / 1e6,
                  event.record.turn);
    return text.data();
}
} // namespace

std::vector<std::uint64_t> CC_RecordingReport::getCallSerials() const
{
    std::vector<std::uint64_t> serials;
    for (Event const& event : m_recording.getEvents())
        if (event.record.call != 0)
            serials.push_back(event.record.call);
    std::sort(serials.begin(), serials.end());
    serials.erase(std::unique(serials.begin(), serials.end()), serials.end());
    return serials;
}

CC_RecordingReport::Lines CC_RecordingReport::getLadder(std::uint64_t call) const
{
    std::vector<Event> const& events = m_recording.getEvents();
    std::vector<std::uint64_t> const legs = LEGS_OF(call, events);
    Lines lines;
    long long start = 0;
    for (Event const& event : events)
    {
        Record const& record = event.record;
        // what a leg went through before it came and after it left is told, too, but not its time in other calls
        if (call == 0 || (record.call != call && (record.call != 0 || !CONTAINS(legs, record.leg))) ||
            IS_SAID_ALREADY(event))
            continue;
        if (lines.empty())
        {
            start = record.nanoseconds;
            lines.push_back("call " + std::to_string(call) + ", from " + timeOf(event));
            std::string head = PADDED("         ms    turn", 21);
            for (std::uint64_t const leg : legs)
                head += PADDED(nameOf(leg), COLUMN_WIDTH);
            lines.push_back(head.substr(0, head.find_last_not_of(' ') + 1));
        }
        std::string line = TIME_AND_TURN(event, start);
        auto const column = std::find(legs.begin(), legs.end(), record.leg);
        if (column == legs.end())
            line += "-- ";
        else
            for (auto left = legs.begin(); left != column + 1; ++left)
                line += left == column ? "| " : PADDED("|", COLUMN_WIDTH);
        lines.push_back(line + textOf(event));
    }
    return lines;
}

CC_RecordingReport::Lines CC_RecordingReport::getLadders() const
{
    Lines lines;
    for (std::uint64_t const call : getCallSerials())
    {
        Lines const ladder = getLadder(call);
        if (!lines.empty())
            lines.emplace_back();
        lines.insert(lines.end(), ladder.begin(), ladder.end());
    }
    return lines;
}

/// What is known of one call when the recording ends.
class CC_RecordingReport::Summary
{
public:
    /// One of the call's events; `cause`: what it gives for one. The first one tells why the call ends.
    void note(Event const& event, std::string const& cause)
    {
        Record const& record = event.record;
        if (m_first == 0)
            m_first = record.nanoseconds;
        m_last = record.nanoseconds;
        if (record.kind == Kind::CALL_ACQUIRED)
            m_hasBeginning = true;
        else if (record.kind == Kind::CALL_ENDED)
            m_hasEnded = true;
        if (record.leg != 0 && !CONTAINS(m_legs, record.leg))
            m_legs.push_back(record.leg);
        if (m_cause.empty())
            m_cause = cause;
    }

    std::string getLine(std::uint64_t call, long long now, Numbers const& numbers) const
    {
        std::array<char, 128> text;
        char const* const state = m_hasEnded ? "ended" : m_hasBeginning ? "up" : "up (beginning lost)";
        std::snprintf(text.data(), text.size(), "%8llu  %-20s %10.3f s  ", static_cast<unsigned long long>(call), state,
                      NANOSECONDS_BETWEEN(m_first, m_hasEnded ? m_last : now) / 1e9);
        return text.data() + PADDED(getNumbers(numbers), 36) + m_cause;
    }

    std::string getJson(std::uint64_t call, long long now, Numbers const& numbers) const
    {
        std::string list;
        for (std::uint64_t const leg : m_legs)
        {
            auto const found = numbers.find(leg);
            bool const isKnown = found != numbers.end() && !found->second.empty();
            (list += list.empty() ? "[" : ",") += isKnown ? CC_JsonLine::QUOTED(found->second) : "null";
        }
        CC_JsonLine line;
        line.add("call", call).add("state", m_hasEnded ? "ended" : "up");
        line.addJson("hasBeginning", m_hasBeginning ? "true" : "false");
        line.addJson("age", std::to_string(std::llround(NANOSECONDS_BETWEEN(m_first, m_hasEnded ? m_last : now))));
        line.addJson("numbers", list.empty() ? "[]" : list + "]");
        if (!m_cause.empty())
            line.add("cause", m_cause);
        return line.get();
    }

private:
    std::string getNumbers(Numbers const& numbers) const
    {
        std::string text;
        for (std::uint64_t const leg : m_legs)
        {
            auto const found = numbers.find(leg);
            (text += text.empty() ? "" : " - ") +=
                found != numbers.end() && !found->second.empty() ? found->second : "?";
        }
        return text;
    }

    std::vector<std::uint64_t> m_legs;
    std::string m_cause;
    long long m_first = 0;
    long long m_last = 0;
    bool m_hasBeginning = false;
    bool m_hasEnded = false;
};

namespace
{
bool IS_CAUSE(Event const& event)
{
    return event.record.kind == Kind::LEG_CHANGED && event.record.detail == CC_PropertyId::CAUSE &&
           (event.after.first != static_cast<std::uint32_t>(QCause::NONE) || event.after.second != 0);
}

bool IS_NUMBER(Event const& event)
{
    return event.record.kind == Kind::LEG_CHANGED && event.record.detail == CC_PropertyId::E164_NUMBER;
}
} // namespace

std::map<std::uint64_t, CC_RecordingReport::Summary> CC_RecordingReport::summarise(Numbers& numbers) const
{
    std::map<std::uint64_t, Summary> calls;
    for (Event const& event : m_recording.getEvents())
    {
        if (IS_NUMBER(event)) // told before the leg joins
            numbers[event.record.leg] = valueOf(event, event.after);
        if (event.record.call != 0)
            calls[event.record.call].note(event, IS_CAUSE(event) ? valueOf(event, event.after) : std::string());
    }
    return calls;
}

CC_RecordingReport::Lines CC_RecordingReport::getCalls() const
{
    Numbers numbers;
    Lines lines{"    call  state                       age  numbers                             cause"};
    for (auto const& [call, summary] : summarise(numbers))
        lines.push_back(summary.getLine(call, m_recording.getEvents().back().record.nanoseconds, numbers));
    return lines;
}

CC_RecordingReport::Lines CC_RecordingReport::getCallsJson() const
{
    Numbers numbers;
    Lines lines;
    for (auto const& [call, summary] : summarise(numbers))
        lines.push_back(summary.getJson(call, m_recording.getEvents().back().record.nanoseconds, numbers));
    return lines;
}
