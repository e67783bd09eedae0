// The calls that are up, those first that an operator would look at first. Runs in a copy of the process.
#include "operation/control/ControlCommands.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "diagnosis/CC_JsonLine.h"
#include "diagnosis/SafeText.h"
#include "operation/control/ControlNumber.h"
#include "operation/record/CallLine.h"

#include <spdlog/fmt/fmt.h>

#include <algorithm>
#include <map>

namespace
{
constexpr unsigned long long MOST_ROWS = 100000;

struct TopRow
{
    unsigned long long serial = 0;
    double age = 0; ///< seconds
    char const* state = "";
    double rate = 0;         ///< packets a second that came from the parties, since the answer
    double lost = 0;         ///< share, 0 to 1, of the worst party
    double opinion = 0;      ///< score of the worst party; 0: not known
    bool isMeasured = false; ///< the two before
    std::string parties;
};

using Order = bool (*)(TopRow const&, TopRow const&);

/// What is not known is not bad.
double BADNESS(TopRow const& row) { return row.opinion > 0 ? row.opinion : 6 - row.lost; }

Order ORDER_BY(std::string const& name)
{
    if (name == "age")
        return [](TopRow const& one, TopRow const& other) { return one.age > other.age; };
    if (name == "rate")
        return [](TopRow const& one, TopRow const& other) { return one.rate > other.rate; };
    if (name == "quality")
        return [](TopRow const& one, TopRow const& other) { return BADNESS(one) < BADNESS(other); };
    return nullptr;
}

void ADD_QUALITY(TopRow& row, CallRecord::Quality const& quality, double seconds)
{
    if (quality.opinion > 0)
        row.opinion = row.opinion > 0 ? std::min(row.opinion, quality.opinion) : quality.opinion;
    if (!quality.isMeasured)
        return;
    row.isMeasured = true;
    row.rate += quality.received / std::max(1.0, seconds);
    double const sent = static_cast<double>(quality.received) + quality.lost;
    row.lost = std::max(row.lost, sent > 0 ? quality.lost / sent : 0);
}

TopRow ROW_OF(CallRecord const& record, double age)
{
    TopRow row;
    row.serial = record.serial;
    row.age = age;
    row.state = record.answered ? "answered" : record.ringing ? "ringing" : "dialled";
    for (CallRecord::Leg const& leg : record.legs)
        row.parties +=
            fmt::format("{}{} {}", row.parties.empty() ? "" : " - ", leg.interface, CallLine::NUMBER_OF(leg));
    row.parties = SAFE_TEXT(row.parties);
    return row;
}

std::string MEASURED(TopRow const& row, double value, unsigned int digits)
{
    return row.isMeasured ? fmt::format("{:.{}f}", value, digits) : "-";
}

std::string LINE_OF(TopRow const& row)
{
    return fmt::format("{:>8} {:>9.0f} {:<9} {:>8} {:>6} {:>5}  {}", row.serial, row.age, row.state,
                       MEASURED(row, row.rate, 1), MEASURED(row, row.lost * 100, 1),
                       row.opinion > 0 ? fmt::format("{:.2f}", row.opinion) : "-", row.parties);
}

std::string JSON_OF(TopRow const& row)
{
    return CC_JsonLine()
        .add("call", row.serial)
        .addJson("age", fmt::format("{:.3f}", row.age))
        .add("state", std::string_view(row.state))
        .addJson("packetsPerSecond", row.isMeasured ? fmt::format("{:.3f}", row.rate) : "null")
        .addJson("lost", row.isMeasured ? fmt::format("{:.5f}", row.lost) : "null")
        .addJson("opinion", row.opinion > 0 ? fmt::format("{:.2f}", row.opinion) : "null")
        .add("parties", row.parties)
        .get();
}

std::vector<TopRow> COLLECT(CallWatch const& watch, String const& context)
{
    std::map<unsigned long long, TopRow> rows;
    std::map<unsigned long long, double> answered; // seconds that calls have been
    watch.visit(
        [&](CallRecord const& record, double age)
        {
            rows.emplace(record.serial, ROW_OF(record, age));
            answered[record.serial] = age - record.answered.value_or(age);
        });
    for (unsigned int i = 0; CC_Call const* const call = CallControl::GET_CALL(context, i); ++i)
        if (auto const row = rows.find(call->getSerial()); row != rows.end())
            for (unsigned int j = 0; CC_CallLeg const* const leg = call->getCallLeg(j); ++j)
                if (auto const quality = CallWatch::GET_QUALITY(*leg))
                    ADD_QUALITY(row->second, *quality, answered[call->getSerial()]);
    std::vector<TopRow> result;
    result.reserve(rows.size());
    for (auto& [serial, row] : rows)
        result.push_back(std::move(row));
    return result;
}
} // namespace

ControlAnswer ControlCommands::top(ControlRequest const& request)
{
    auto const sort = request.options.find("sort");
    auto const wanted = request.options.find("rows");
    Order const isBefore = ORDER_BY(sort != request.options.end() ? sort->second : "age");
    auto const most = wanted != request.options.end() ? CONTROL_NUMBER(wanted->second, MOST_ROWS) : MOST_ROWS;
    if (isBefore == nullptr)
        return {{}, "--sort wants age, rate or quality"};
    if (!most)
        return {{}, "--rows wants a number"};
    std::vector<TopRow> rows = COLLECT(m_watch, m_host.contextName);
    std::stable_sort(rows.begin(), rows.end(), isBefore);
    rows.resize(std::min<std::size_t>(rows.size(), *most));
    ControlAnswer answer;
    if (!request.isJson)
    {
        Counters const& counters = m_host.counters;
        answer.lines.push_back(fmt::format("{}: {} calls up; {} placed, {} answered, {} failed, {} refused", getPhase(),
                                           CallControl::GET_NUMBER_OF_CALLS(), counters.placed, counters.answered,
                                           counters.failed, counters.refused));
        answer.lines.push_back(fmt::format("{:>8} {:>9} {:<9} {:>8} {:>6} {:>5}  {}", "call", "age/s", "state",
                                           "packet/s", "lost/%", "score", "parties"));
    }
    for (TopRow const& row : rows)
        answer.lines.push_back(request.isJson ? JSON_OF(row) : LINE_OF(row));
    return answer;
}
