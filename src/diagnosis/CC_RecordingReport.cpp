#include "diagnosis/CC_RecordingReport.h"

#include "diagnosis/CC_BriefText.h"
#include "diagnosis/CC_JsonLine.h"
#include "diagnosis/SafeText.h"
#include "platform/base/NameOf.h"
#include "platform/base/XCode.h"
#include "platform/signalling/QCause.h"
#include "platform/signalling/QPresentationIndicator.h"
#include "properties/CC_PropertyClasses.h"
#include "properties/CC_PropertyTable.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <ctime>
#include <iterator>
#include <utility>

using namespace CC_RecordFormat;

namespace
{
using Event = CC_Recording::Event;

constexpr long long NANOSECONDS_IN_SECOND = 1000000000;
constexpr long long NANOSECONDS_IN_MICROSECOND = 1000;

// what of a party one presentation indicator speaks for
enum Party : unsigned int
{
    FIRST,
    SECOND,
    REDIRECTING,
    NOBODY
};

struct Personal
{
    unsigned int id;
    Party party;
};
constexpr Personal PERSONAL[] = {
    {CC_PropertyId::E164_NUMBER, FIRST},
    {CC_PropertyId::NAME, FIRST},
    {CC_PropertyId::DISPLAY, FIRST},
    {CC_PropertyId::URI, FIRST},
    {CC_PropertyId::SIP_HEADERS, FIRST},
    {CC_PropertyId::IP_ADDRESS, FIRST},
    {CC_PropertyId::SECOND_E164_NUMBER, SECOND},
    {CC_PropertyId::REDIRECTING_E164_NUMBER, REDIRECTING},
    {CC_PropertyId::REDIRECTING_NAME, REDIRECTING},
    {CC_PropertyId::REDIRECTING_FIRST_E164_NUMBER, REDIRECTING},
    {CC_PropertyId::REDIRECTING_FIRST_NAME, REDIRECTING},
};
constexpr Personal INDICATORS[] = {
    {CC_PropertyId::PRESENTATION_INDICATOR, FIRST},
    {CC_PropertyId::SECOND_PRESENTATION_INDICATOR, SECOND},
    {CC_PropertyId::DIVERSION_PRESENTATION_INDICATOR, REDIRECTING},
};

template <class Table>
Party PARTY_OF(Table const& table, unsigned int id)
{
    auto const* const found =
        std::find_if(std::begin(table), std::end(table), [id](Personal const& row) { return row.id == id; });
    return found != std::end(table) ? found->party : NOBODY;
}

std::string NAME_OF_PROPERTY(unsigned int id)
{
    CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(id);
    if (row != nullptr && row->longName != nullptr)
        return row->longName;
    std::array<char, 16> number;
    std::snprintf(number.data(), number.size(), "0x%x", id);
    return number.data();
}

/// Whether it is what users call the property: its long name, its short one, or its number as above.
bool IS_NAMED(unsigned int id, std::string_view name)
{
    CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(id);
    bool const isShortName = row != nullptr && row->shortName != nullptr && name == row->shortName;
    return isShortName || name == NAME_OF_PROPERTY(id);
}

bool IS_CHANGE_OF(Event const& event, std::uint64_t leg, std::string_view propertyName)
{
    return event.record.kind == Kind::LEG_CHANGED && event.record.leg == leg &&
           IS_NAMED(event.record.detail, propertyName);
}

char const* NAME(Kind kind)
{
    static constexpr NamedValue<Kind> NAMES[] = {{Kind::CALL_ACQUIRED, "CALL_ACQUIRED"},
                                                 {Kind::CALL_GIVEN_BACK, "CALL_GIVEN_BACK"},
                                                 {Kind::CALL_ENDED, "CALL_ENDED"},
                                                 {Kind::CALL_CHANGED, "CALL_CHANGED"},
                                                 {Kind::LEG_MADE, "LEG_MADE"},
                                                 {Kind::LEG_NAMED, "LEG_NAMED"},
                                                 {Kind::LEG_JOINED, "LEG_JOINED"},
                                                 {Kind::LEG_LEFT, "LEG_LEFT"},
                                                 {Kind::LEG_MOVED, "LEG_MOVED"},
                                                 {Kind::LEG_CHANGED, "LEG_CHANGED"},
                                                 {Kind::LEG_ENDED, "LEG_ENDED"},
                                                 {Kind::DIALLING, "DIALLING"},
                                                 {Kind::DIALLED, "DIALLED"},
                                                 {Kind::OFFERED, "OFFERED"},
                                                 {Kind::OFFER_TAKEN, "OFFER_TAKEN"},
                                                 {Kind::ACCEPTED, "ACCEPTED"},
                                                 {Kind::TRANSFERRED, "TRANSFERRED"},
                                                 {Kind::DROPPED, "DROPPED"},
                                                 {Kind::FAILED, "FAILED"},
                                                 {Kind::SERVICE, "SERVICE"},
                                                 {Kind::SERVICE_TOLD, "SERVICE_TOLD"},
                                                 {Kind::TOLD, "TOLD"},
                                                 {Kind::CLEANED_UP, "CLEANED_UP"},
                                                 {Kind::PUSHED_BACK, "PUSHED_BACK"},
                                                 {Kind::LOCK_TAKEN, "LOCK_TAKEN"},
                                                 {Kind::LOCK_GIVEN_BACK, "LOCK_GIVEN_BACK"}};
    return NAME_OF(NAMES, kind);
}

char const* NAME(Writer writer)
{
    static constexpr NamedValue<Writer> NAMES[] = {{Writer::OUTSIDE, "code outside any adapter"},
                                                   {Writer::OWN, "its own adapter"},
                                                   {Writer::PEER, "the peer's adapter"},
                                                   {Writer::CALL, "an adapter of the call"},
                                                   {Writer::POOL, "the pool"},
                                                   {Writer::LEG, "the leg"},
                                                   {Writer::FILTER, "a filter past the adapter"}};
    return NAME_OF(NAMES, writer);
}

char const* NAME(CleanUp outcome)
{
    static constexpr NamedValue<CleanUp> NAMES[] = {{CleanUp::KEPT, "the call stays: a leg is live"},
                                                    {CleanUp::GIVEN_BACK, "the call ends: no leg is live"},
                                                    {CleanUp::OVERTAKEN, "somebody released the call meanwhile"}};
    return NAME_OF(NAMES, outcome);
}

std::string RESULT(unsigned int detail) { return XCode(detail).getName(); }

std::string CAUSE(Event const& event)
{
    auto const cause = static_cast<QCause>(event.record.detail);
    std::string text = cause == QCause::UNSPECIFIED
                           ? "without a cause"
                           : "cause " + std::to_string(event.record.detail) + " " + QCAUSE_NAME(cause);
    return event.number == 0 ? text : text + ", SIP " + std::to_string(event.number);
}

std::string IDS(Event const& event)
{
    std::string text;
    for (std::uint32_t const id : event.ids)
        (text += text.empty() ? "" : ", ") += NAME_OF_PROPERTY(id);
    return event.record.detail <= CC_RecordFormat::MOST_TOLD ? text : text + " and more";
}
} // namespace

CC_RecordingReport::CC_RecordingReport(CC_Recording recording, Privacy privacy)
    : m_recording(std::move(recording)), m_privacy(privacy)
{
    for (Event const& event : m_recording.getEvents())
        note(event);
}

CC_RecordingReport::Leg const* CC_RecordingReport::find(std::uint64_t leg) const
{
    auto const found = m_legs.find(leg);
    return found != m_legs.end() ? &found->second : nullptr;
}

void CC_RecordingReport::note(Event const& event)
{
    if (event.record.leg == 0)
        return;
    Leg& leg = m_legs[event.record.leg];
    if (event.record.kind == Kind::LEG_MADE)
        leg.hasBeginning = true;
    else if (event.record.kind == Kind::LEG_NAMED)
        leg.name = event.text;
    else if (event.record.kind == Kind::LEG_CHANGED)
        if (Party const party = PARTY_OF(INDICATORS, event.record.detail); party != NOBODY)
        {
            bool const isAllowed = event.after.first == static_cast<std::uint32_t>(QPresentationIndicator::ALLOWED);
            (isAllowed ? leg.isAllowed : leg.isWithheld)[party] = true;
        }
}

bool CC_RecordingReport::isWithheld(std::uint64_t leg, unsigned int propertyId) const
{
    Party const party = PARTY_OF(PERSONAL, propertyId);
    if (m_privacy == Privacy::WHOLE || party == NOBODY)
        return false;
    Leg const* const found = find(leg);
    return found == nullptr || found->isWithheld[party] || (!found->hasBeginning && !found->isAllowed[party]);
}

std::string CC_RecordingReport::valueOf(Event const& event, Brief const& brief) const
{
    bool const isThere = brief.place != Brief::NOTHING && (brief.textLength != 0 || brief.place == Brief::OTHER_CLASS);
    if (isThere && event.record.kind == Kind::LEG_CHANGED && isWithheld(event.record.leg, event.record.detail))
        return "(withheld)";
    return SAFE_TEXT(CC_BriefText::OF(event.record.detail, brief));
}

std::string CC_RecordingReport::nameOf(std::uint64_t leg) const
{
    Leg const* const found = find(leg);
    std::string const serial = "leg " + std::to_string(leg);
    return found != nullptr && !found->name.empty() ? serial + " " + SAFE_TEXT(found->name) : serial;
}

/// Empty for the ordinary case: a leg's own adapter, no filter.
std::string CC_RecordingReport::writerOf(Event const& event) const
{
    std::string text;
    Writer const writer = event.record.writer;
    if (writer != Writer::OWN || event.by != event.record.leg)
    {
        text = NAME(writer);
        if (event.by != 0)
            text += ", " + nameOf(event.by);
    }
    if (!event.filter.empty())
        (text += text.empty() ? "" : ", ") +=
            "filter " + std::to_string(event.filterPlace) + " " + SAFE_TEXT(event.filter);
    return text;
}

std::string CC_RecordingReport::changeOf(Event const& event) const
{
    std::string text = NAME_OF_PROPERTY(event.record.detail) + ": ";
    if (event.before.place != Brief::NOTHING)
        text += valueOf(event, event.before) + " -> ";
    text += valueOf(event, event.after);
    std::string const writer = writerOf(event);
    return writer.empty() ? text : text + " [" + writer + "]";
}

std::string CC_RecordingReport::textOf(Event const& event) const
{
    unsigned int const detail = event.record.detail;
    switch (event.record.kind)
    {
    case Kind::CALL_ACQUIRED:
        return "call made";
    case Kind::CALL_GIVEN_BACK:
        return "call given back to its pool";
    case Kind::CALL_ENDED:
        return "call ended";
    case Kind::CALL_CHANGED:
    case Kind::LEG_CHANGED:
        return changeOf(event);
    case Kind::LEG_MADE:
        return "leg made";
    case Kind::LEG_NAMED:
        return "named " + SAFE_TEXT(event.text);
    case Kind::LEG_JOINED:
        return "joins call " + std::to_string(event.record.call);
    case Kind::LEG_LEFT:
        return "leaves call " + std::to_string(event.record.call);
    case Kind::LEG_MOVED:
        return "has moved from " + (event.number == 0 ? "no call" : "call " + std::to_string(event.number)) + " to " +
               (event.record.call == 0 ? "no call" : "call " + std::to_string(event.record.call));
    case Kind::LEG_ENDED:
        return "leg ended";
    case Kind::DIALLING:
        return "dials " + SAFE_TEXT(event.text);
    case Kind::DIALLED:
        return "dialled: " + RESULT(detail);
    case Kind::OFFERED:
        return "offered to a " + SAFE_TEXT(event.text);
    case Kind::OFFER_TAKEN:
        return "the " + SAFE_TEXT(event.text) + " says " + RESULT(detail);
    case Kind::ACCEPTED:
        return "accepted: " + RESULT(detail);
    case Kind::TRANSFERRED:
        return SAFE_TEXT(event.text) + " of the other legs of call " + std::to_string(event.number) +
               " to here: " + RESULT(detail);
    case Kind::DROPPED:
        return "drops " + CAUSE(event);
    case Kind::FAILED:
        return SAFE_TEXT(event.text);
    case Kind::SERVICE:
        return "asks " + SAFE_TEXT(event.text);
    case Kind::SERVICE_TOLD:
        return "<- " + SAFE_TEXT(event.text) + " from leg " + std::to_string(event.number);
    case Kind::TOLD:
        return "<- told: " + IDS(event);
    case Kind::CLEANED_UP:
        return std::string("clean-up: ") + NAME(static_cast<CleanUp>(detail));
    case Kind::PUSHED_BACK:
        return "asked to step back from an internal loop";
    case Kind::LOCK_TAKEN:
        return "reload lock taken";
    case Kind::LOCK_GIVEN_BACK:
        return "reload lock given back";
    default:
        return "(unknown)";
    }
}

/// Of the day, in UTC.
std::string CC_RecordingReport::timeOf(Event const& event) const
{
    long long const realtime = m_recording.getRealtime(event);
    auto const seconds = static_cast<std::time_t>(realtime / NANOSECONDS_IN_SECOND);
    std::tm parts{};
    if (realtime < 0 || gmtime_r(&seconds, &parts) == nullptr)
        return "(no time)";
    std::array<char, 64> text;
    std::size_t const length = std::strftime(text.data(), text.size(), "%Y-%m-%dT%H:%M:%S", &parts);
    auto const microseconds = static_cast<int>(realtime % NANOSECONDS_IN_SECOND / NANOSECONDS_IN_MICROSECOND);
    std::snprintf(text.data() + length, text.size() - length, ".%06dZ", microseconds);
    return text.data();
}

CC_RecordingReport::Lines CC_RecordingReport::getHistory(std::uint64_t leg, std::string_view propertyName) const
{
    Lines lines;
    for (Event const& event : m_recording.getEvents())
    {
        if (!IS_CHANGE_OF(event, leg, propertyName))
            continue;
        std::string const writer = writerOf(event);
        lines.push_back(timeOf(event) + "  turn " + std::to_string(event.record.turn) + "  " +
                        valueOf(event, event.after) + "  by " + (writer.empty() ? NAME(Writer::OWN) : writer));
    }
    return lines;
}

CC_RecordingReport::Lines CC_RecordingReport::getHistoryJson(std::uint64_t leg, std::string_view propertyName) const
{
    Lines lines;
    for (Event const& event : m_recording.getEvents())
        if (IS_CHANGE_OF(event, leg, propertyName))
            lines.push_back(jsonOf(event));
    return lines;
}

std::string CC_RecordingReport::jsonOf(Event const& event) const
{
    Record const& record = event.record;
    CC_JsonLine line;
    line.add("time", timeOf(event)).add("turn", record.turn).add("event", NAME(record.kind));
    if (record.call != 0)
        line.add("call", record.call);
    if (record.leg != 0)
        line.add("leg", record.leg).add("legName", find(record.leg)->name);
    if (record.kind == Kind::LEG_CHANGED || record.kind == Kind::CALL_CHANGED)
    {
        line.add("property", NAME_OF_PROPERTY(record.detail)).add("id", record.detail);
        if (event.before.place != Brief::NOTHING)
            line.add("before", valueOf(event, event.before));
        line.add("after", valueOf(event, event.after)).add("writer", NAME(record.writer));
        if (event.by != 0)
            line.add("by", event.by);
        if (!event.filter.empty())
            line.add("filter", event.filter).add("filterPlace", event.filterPlace);
    }
    return line.add("text", textOf(event)).get();
}

CC_RecordingReport::Lines CC_RecordingReport::getJson(std::uint64_t call) const
{
    Lines lines;
    for (Event const& event : m_recording.getEvents())
        if (call == 0 || event.record.call == call)
            lines.push_back(jsonOf(event));
    return lines;
}

InfoContainer& CC_RecordingReport::ADD(InfoContainer& info, unsigned int level, Lines const& lines)
{
    for (std::string const& line : lines)
        info.add(level, 0, String(std::string_view(line)), String::s_empty);
    return info;
}
