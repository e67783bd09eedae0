#include "operation/page/StatusPage.h"

#include "callcontrol/CallControl.h"
#include "callcontrol/version.h"
#include "diagnosis/SafeText.h"
#include "operation/Log.h"
#include "operation/record/CallLine.h"
#include "operation/record/CallWatch.h"

#include <spdlog/fmt/fmt.h>

#include <algorithm>
#include <vector>

namespace
{
constexpr char const* HEAD = R"(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8"/>
<meta http-equiv="refresh" content="5"/>
<title>callcontrol-gateway</title>
<style>
body { font-family: sans-serif; margin: 2em; }
table { border-collapse: collapse; }
th, td { text-align: left; padding: 0.2em 1em 0.2em 0; border-bottom: 1px solid #ccc; }
</style>
</head>
<body>
)";

using Cells = std::vector<std::string>;

/// Text of anybody's as text alone.
std::string HTML_OF(std::string_view text)
{
    std::string html;
    for (char const c : SAFE_TEXT(text))
        switch (c)
        {
        case '&':
            html += "&amp;";
            break;
        case '<':
            html += "&lt;";
            break;
        case '>':
            html += "&gt;";
            break;
        case '"':
            html += "&quot;";
            break;
        default:
            html += c;
        }
    return html;
}

std::string TABLE_ROW(Cells const& cells, char const* element)
{
    std::string html = "<tr>";
    for (std::string const& cell : cells)
        html += fmt::format("<{0}>{1}</{0}>", element, HTML_OF(cell));
    return html + "</tr>\n";
}

std::string TABLE(char const* title, Cells const& names, std::vector<Cells> const& rows)
{
    std::string html = fmt::format("<h2>{}</h2>\n<table>\n{}", title, TABLE_ROW(names, "th"));
    for (Cells const& row : rows)
        html += TABLE_ROW(row, "td");
    return html + "</table>\n";
}

struct CallUp
{
    CallRecord const* record;
    double age;
};

Cells CELLS_OF(CallUp const& call)
{
    CallRecord const& record = *call.record;
    std::string parties;
    for (CallRecord::Leg const& leg : record.legs)
        parties += fmt::format("{}{} {}", parties.empty() ? "" : " - ", leg.interface, CallLine::NUMBER_OF(leg));
    char const* const state = record.answered ? "answered" : record.ringing ? "ringing" : "dialled";
    return {std::to_string(record.serial), state, fmt::format("{:.0f}", call.age), parties};
}
} // namespace

std::string StatusPage::getText() const
{
    return HEAD + getState() + getInterfaces() + getPeers() + getCalls() + "</body>\n</html>\n";
}

std::string StatusPage::getState() const
{
    Counters const& counters = m_host.counters;
    char const* const phase = m_host.isEnding ? "ending" : m_host.isDraining ? "draining" : "serving";
    return fmt::format("<h1>{}, {} calls up</h1>\n", phase, CallControl::GET_NUMBER_OF_CALLS()) +
           TABLE("Since the start",
                 {"placed", "answered", "cleared", "failed", "refused", "log lines dropped", "version"},
                 {{std::to_string(counters.placed), std::to_string(counters.answered), std::to_string(counters.cleared),
                   std::to_string(counters.failed), std::to_string(counters.refused),
                   std::to_string(GET_DROPPED_LOG_LINES()), CALLCONTROL_LIBRARY_VERSION_STRING()}});
}

std::string StatusPage::getInterfaces() const
{
    std::vector<Cells> rows;
    for (auto const& [name, module] : m_interfaces)
        rows.push_back({name, module, m_host.isBlocked(name) ? "blocked" : "in service"});
    return TABLE("Interfaces", {"interface", "module", "state"}, rows);
}

std::string StatusPage::getPeers() const
{
    std::vector<Cells> rows;
    Cells names;
    for (auto const& [name, module] : m_modules)
        for (StateRow const& row : module->getPeers())
        {
            Cells& cells = rows.emplace_back();
            names.clear();
            for (auto const& [column, text] : row)
            {
                names.emplace_back(column);
                cells.push_back(text);
            }
        }
    return TABLE("Peers", names, rows);
}

std::string StatusPage::getCalls() const
{
    std::vector<CallUp> calls;
    m_watch.visit([&](CallRecord const& record, double age) { calls.push_back({&record, age}); });
    std::size_t const shown = std::min(calls.size(), MOST_CALLS);
    std::partial_sort(calls.begin(), calls.begin() + static_cast<std::ptrdiff_t>(shown), calls.end(),
                      [](CallUp const& one, CallUp const& other) { return one.age > other.age; });
    std::vector<Cells> rows;
    for (std::size_t i = 0; i < shown; ++i)
        rows.push_back(CELLS_OF(calls[i]));
    std::string const rest =
        shown < calls.size() ? fmt::format("<p>and {} that are younger</p>\n", calls.size() - shown) : "";
    return TABLE("Calls, the oldest first", {"call", "state", "age/s", "parties"}, rows) + rest;
}
