// What is known of calls. These run in a copy of the process: each may look at everything, and change nothing.
#include "operation/control/ControlCommands.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "diagnosis/CC_Explanation.h"
#include "diagnosis/CC_JsonLine.h"
#include "diagnosis/CC_RecordingReport.h"
#include "operation/control/ControlNumber.h"
#include "operation/record/CallLine.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "recorder/CC_Recorder.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <sstream>

namespace
{
using Explained = CC_Explanation::Call;

constexpr unsigned int EVERYTHING = 99; // levels of a dump
constexpr unsigned int OLDEST = 4294967295;

CC_RecordingReport RECORDED() { return CC_RecordingReport(CC_Recording::READ(CC_Recorder::GET_IMAGE())); }

std::string SECONDS(CC_Explanation::Age const& age)
{
    return age.isKnown ? fmt::format("{:.1f}", static_cast<double>(age.nanoseconds) / 1e9) : "?";
}

/// A leg's name is that of its interface with the number of its call behind it.
bool HAS_LEG_OF(Explained const& call, std::string const& interface)
{
    return std::any_of(call.legs.begin(), call.legs.end(),
                       [&](CC_Explanation::Leg const& leg) { return leg.name.starts_with(interface + '/'); });
}

std::string LEGS(Explained const& call)
{
    std::string text;
    for (CC_Explanation::Leg const& leg : call.legs)
        text +=
            fmt::format("{}{} {}", text.empty() ? "" : ", ", leg.name,
                        CC_PropertyCallLegState::STATE_NAME(static_cast<CC_PropertyCallLegState::State>(leg.state)));
    return text;
}

std::string NUMBERS(CallRecord const* record)
{
    std::string text;
    if (record != nullptr)
        for (CallRecord::Leg const& leg : record->legs)
            text += (text.empty() ? "" : " - ") + CallLine::NUMBER_OF(leg);
    return text;
}

std::string LINE(Explained const& call, CallRecord const* record)
{
    return fmt::format("{:>8} {:<10} {:>10} {:>10}  {}; {}", call.serial,
                       CC_Call::STATE_NAME(static_cast<CC_Call::State>(call.state)), SECONDS(call.age),
                       SECONDS(call.inState), LEGS(call), NUMBERS(record));
}

void ADD_LINES(std::vector<std::string>& lines, std::string_view text)
{
    std::istringstream stream{std::string(text)};
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
}

void ADD_LINES(std::vector<std::string>& lines, std::vector<std::string> const& more)
{
    lines.insert(lines.end(), more.begin(), more.end());
}

CC_Call const* FIND_CALL(unsigned long long serial, String const& context)
{
    for (unsigned int i = 0; CC_Call const* const call = CallControl::GET_CALL(context, i); ++i)
        if (call->getSerial() == serial)
            return call;
    return nullptr;
}

/// A line of text and the record's own, or a line of JSON, for each leg that has one.
void ADD_QUALITY(std::vector<std::string>& lines, CC_Call const& call, bool isJson)
{
    for (unsigned int i = 0; CC_CallLeg const* const leg = call.getCallLeg(i); ++i)
        if (CC_Property const* const quality = leg->getProperties().get(CC_PropertyId::QUALITY_OF_SERVICE))
        {
            String value;
            quality->getValueString(value);
            if (isJson)
            {
                lines.push_back(CC_JsonLine()
                                    .add("leg", leg->getSerial())
                                    .add("legName", leg->getName().view())
                                    .add("quality", value.view())
                                    .get());
                continue;
            }
            lines.push_back(fmt::format("quality of leg {} {}", leg->getSerial(), leg->getName().view()));
            ADD_LINES(lines, value.view());
        }
}
} // namespace

ControlAnswer ControlCommands::calls(ControlRequest const& request)
{
    auto const older = request.options.find("older");
    auto const seconds = older != request.options.end() ? CONTROL_NUMBER(older->second, OLDEST) : 0;
    if (!seconds)
        return {{}, "--older wants seconds"};
    auto const from = request.options.find("interface");
    CC_Explanation const explanation = CC_Explanation::OF_CALLS_OLDER_THAN(static_cast<unsigned int>(*seconds));
    std::vector<std::string> const json = request.isJson ? explanation.getJson() : std::vector<std::string>();
    ControlAnswer answer;
    if (!request.isJson)
        answer.lines.push_back(
            fmt::format("{:>8} {:<10} {:>10} {:>10}  {}", "call", "state", "age/s", "in state/s", "legs; numbers"));
    for (std::size_t i = 0; i < explanation.getCalls().size(); ++i)
    {
        Explained const& call = explanation.getCalls()[i];
        if (from == request.options.end() || HAS_LEG_OF(call, from->second))
            answer.lines.push_back(request.isJson ? json[i] : LINE(call, m_watch.find(call.serial)));
    }
    return answer;
}

ControlAnswer ControlCommands::call(ControlRequest const& request)
{
    unsigned long long const serial = CONTROL_NUMBER(request.arguments[0]).value_or(0);
    if (serial == 0)
        return {{}, "call wants a serial number"};
    ControlAnswer answer;
    CC_Explanation const explanation = CC_Explanation::OF_CALL(serial);
    CC_RecordingReport const report = RECORDED();
    CC_Call const* const up = FIND_CALL(serial, m_host.contextName);
    if (request.isJson)
    {
        ADD_LINES(answer.lines, explanation.getJson());
        if (up != nullptr)
            ADD_QUALITY(answer.lines, *up, true);
        ADD_LINES(answer.lines, report.getJson(serial));
    }
    else
    {
        InfoContainer info;
        explanation.getInfo(info, EVERYTHING, 0, 0, 0, String::s_empty); // without observers
        ADD_LINES(answer.lines, info.getString_TreeFormat().view());
        if (up != nullptr)
            ADD_QUALITY(answer.lines, *up, false);
        ADD_LINES(answer.lines, report.getLadder(serial));
    }
    if (answer.lines.empty())
        answer.error = "nothing is known of a call " + request.arguments[0];
    return answer;
}

ControlAnswer ControlCommands::history(ControlRequest const& request)
{
    unsigned long long const leg = CONTROL_NUMBER(request.arguments[0]).value_or(0);
    if (leg == 0)
        return {{}, "history wants the serial number of a leg"};
    std::string const& property = request.arguments[1];
    CC_RecordingReport const report = RECORDED();
    ControlAnswer answer{request.isJson ? report.getHistoryJson(leg, property) : report.getHistory(leg, property), {}};
    if (answer.lines.empty())
        answer.error = "nothing is known of " + property + " of a leg " + request.arguments[0];
    return answer;
}

ControlAnswer ControlCommands::recorded(ControlRequest const& request)
{
    CC_RecordingReport const report = RECORDED();
    return {request.isJson ? report.getCallsJson() : report.getCalls(), {}};
}
