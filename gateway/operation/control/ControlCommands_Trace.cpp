// Peers, registrations and traces.
#include "operation/control/ControlCommands.h"

#include "diagnosis/CC_JsonLine.h"
#include "diagnosis/SafeText.h"
#include "operation/control/ControlNumber.h"
#include "recorder/CC_Recorder.h"

#include <spdlog/fmt/fmt.h>

#include <algorithm>

namespace
{
constexpr std::size_t LONGEST_NUMBER = 64; // digits and more of a user part

std::string JSON_OF(StateRow const& row)
{
    CC_JsonLine line;
    for (auto const& [name, text] : row)
        line.add(name, text);
    return line.get();
}

std::vector<std::size_t> WIDTHS_OF(std::vector<StateRow> const& rows)
{
    std::vector<std::size_t> widths;
    for (StateRow const& row : rows)
        for (std::size_t i = 0; i < row.size(); ++i)
        {
            widths.resize(std::max(widths.size(), i + 1));
            widths[i] = std::max({widths[i], row[i].first.size(), row[i].second.size()});
        }
    return widths;
}

/// A line of the texts, or of their names.
std::string LINE_OF(StateRow const& row, std::vector<std::size_t> const& widths, bool isHead)
{
    std::string line;
    for (std::size_t i = 0; i < row.size(); ++i)
        line += fmt::format("{:<{}}  ", isHead ? row[i].first : std::string_view(row[i].second), widths[i]);
    line.erase(line.find_last_not_of(' ') + 1);
    return SAFE_TEXT(line);
}

ControlAnswer LIST(std::vector<StateRow> const& rows, bool isJson)
{
    ControlAnswer answer;
    std::vector<std::size_t> const widths = WIDTHS_OF(rows);
    if (!isJson && !rows.empty())
        answer.lines.push_back(LINE_OF(rows.front(), widths, true));
    for (StateRow const& row : rows)
        answer.lines.push_back(isJson ? JSON_OF(row) : LINE_OF(row, widths, false));
    return answer;
}

template <class Rows>
std::vector<StateRow> ALL(SignallingModules const& modules, Rows (SignallingModule::*get)() const)
{
    std::vector<StateRow> rows;
    for (auto const& [name, module] : modules)
        for (StateRow& row : ((*module).*get)())
            rows.push_back(std::move(row));
    return rows;
}

bool IS_NUMBER(std::string const& text)
{
    return text.size() <= LONGEST_NUMBER &&
           std::all_of(text.begin(), text.end(), [](unsigned char c) { return c > 0x20 && c < 0x7f; });
}
} // namespace

ControlAnswer ControlCommands::peers(ControlRequest const& request)
{
    return LIST(ALL(m_modules, &SignallingModule::getPeers), request.isJson);
}

ControlAnswer ControlCommands::registrations(ControlRequest const& request)
{
    return LIST(ALL(m_modules, &SignallingModule::getRegistrations), request.isJson);
}

/// What is the serial number of a call that is up is that; anything else is the number of a party.
ControlAnswer ControlCommands::trace(ControlRequest const& request)
{
    std::string const& word = request.arguments[0];
    std::string const& whom = request.arguments[1];
    auto const serial = CONTROL_NUMBER(whom);
    bool const isCall = serial && (m_watch.find(*serial) != nullptr || m_tracer.getSerials().contains(*serial));
    if ((word != "on" && word != "off") || !IS_NUMBER(whom))
        return {{}, "trace wants on or off, and the serial number of a call or the number of a party"};
    if (word == "off")
        return (isCall ? m_tracer.remove(*serial) : m_tracer.remove(whom)) ? ControlAnswer()
                                                                           : ControlAnswer{{}, whom + " is not traced"};
    if (!CC_Recorder::IS_ON())
        return {{}, "nothing is recorded: recording-size is 0"};
    return (isCall ? m_tracer.add(*serial) : m_tracer.add(whom)) ? ControlAnswer()
                                                                 : ControlAnswer{{}, "too much is traced already"};
}
