#include "operation/control/ControlCommands.h"

#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/version.h"
#include "diagnosis/CC_JsonLine.h"
#include "operation/Log.h"
#include "operation/control/ControlNumber.h"
#include "properties/CC_Cause.h"
#include "recorder/CC_Recorder.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <array>
#include <set>
#include <sstream>
#include <unistd.h>

namespace
{
constexpr unsigned int MOST_SECONDS = 86400;
constexpr int HIGHEST_CAUSE = 127; // Q.850

std::string_view BOOLEAN(bool value) { return value ? "true" : "false"; }

/// Name and value, as a line each or as one object.
class Table
{
public:
    explicit Table(bool isJson) : m_isJson(isJson) {}
    void add(std::string const& name, std::string const& text)
    {
        m_json.add(name, text);
        addLine(name, text);
    }
    void add(std::string const& name, unsigned long long number)
    {
        m_json.add(name, number);
        addLine(name, std::to_string(number));
    }
    void addFlag(std::string const& name, bool value)
    {
        m_json.addJson(name, BOOLEAN(value));
        addLine(name, value ? "yes" : "no");
    }
    ControlAnswer get() { return {m_isJson ? std::vector{m_json.get()} : m_lines, {}}; }

private:
    void addLine(std::string const& name, std::string const& value)
    {
        m_lines.push_back(fmt::format("{:<20} {}", name, value));
    }

    bool m_isJson;
    CC_JsonLine m_json;
    std::vector<std::string> m_lines;
};

ControlAnswer FAILED(std::string reason) { return {{}, std::move(reason)}; }
} // namespace

struct ControlCommands::Command
{
    char const* verb;
    char const* usage; ///< what comes behind the verb
    char const* what;
    ControlAnswer (ControlCommands::*answer)(ControlRequest const&);
    std::size_t arguments;
    std::set<std::string_view> options = {};
    bool isLong = false;
    bool changesSomething = false;
};

ControlCommands::Command const* ControlCommands::FIND(std::string_view verb)
{
    using This = ControlCommands;
    static std::array const s_commands{
        Command{"status", "", "what the gateway is doing", &This::status, 0},
        Command{"calls",
                "[--older SECONDS] [--interface NAME]",
                "the calls that are up",
                &This::calls,
                0,
                {"older", "interface"},
                true},
        Command{"call", "SERIAL", "one call: who holds it, its quality, its ladder", &This::call, 1, {}, true},
        Command{
            "history", "SERIAL PROPERTY", "each value that a property of the leg took", &This::history, 2, {}, true},
        Command{"recorded",
                "",
                "the calls that the recorder knows, also those that are over",
                &This::recorded,
                0,
                {},
                true},
        Command{"interfaces", "", "the interfaces and their state", &This::interfaces, 0},
        Command{"peers", "", "whom the interfaces talk to", &This::peers, 0, {}, true},
        Command{"registrations", "", "who is registered, here or with a peer", &This::registrations, 0, {}, true},
        Command{"top",
                "[--sort age|rate|quality] [--rows N]",
                "the calls that are up, with their media",
                &This::top,
                0,
                {"sort", "rows"},
                true},
        Command{"trace", "on|off SERIAL|NUMBER", "tell calls when they are over", &This::trace, 2, {}, false, true},
        Command{"stats", "", "counters since the start", &This::stats, 0},
        Command{"drop", "SERIAL CAUSE", "clear a call with a cause of Q.850", &This::drop, 2, {}, false, true},
        Command{"block", "INTERFACE", "no new calls on it, either way", &This::block, 1, {}, false, true},
        Command{"unblock", "INTERFACE", "calls again", &This::unblock, 1, {}, false, true},
        Command{"drain", "", "no new calls; those that are up go on", &This::drain, 0, {}, false, true},
        Command{"resume", "", "new calls again", &This::resume, 0, {}, false, true},
        Command{"reload", "", "follow a changed configuration", &This::reload, 0, {}, false, true},
        Command{"shutdown",
                "[--graceful SECONDS]",
                "end with the last call, or after that time",
                &This::shutDown,
                0,
                {"graceful"},
                false,
                true},
        Command{"help", "", "these commands", &This::help, 0},
        Command{nullptr, nullptr, nullptr, nullptr, 0}};
    if (verb.empty())
        return s_commands.data();
    auto const found = std::find_if(s_commands.begin(), s_commands.end() - 1,
                                    [&](Command const& command) { return command.verb == verb; });
    return found != s_commands.end() - 1 ? &*found : nullptr;
}

bool ControlCommands::isLong(ControlRequest const& request) const
{
    Command const* const command = request.verb.empty() ? nullptr : FIND(request.verb);
    return command != nullptr && command->isLong;
}

ControlAnswer ControlCommands::answer(ControlRequest const& request, std::string const& user)
{
    Command const* const command = request.verb.empty() ? nullptr : FIND(request.verb);
    if (command == nullptr)
        return FAILED("there is no command '" + request.verb + "'; help lists them");
    bool const areOptionsKnown =
        std::all_of(request.options.begin(), request.options.end(),
                    [&](auto const& option) { return command->options.contains(option.first); });
    if (request.arguments.size() != command->arguments || !areOptionsKnown)
        return FAILED(std::string("usage: ") + command->verb + " " + command->usage);
    ControlAnswer answer = (this->*command->answer)(request);
    if (command->changesSomething)
        spdlog::info("control: {}{}{} asked for by {}: {}", request.verb, request.arguments.empty() ? "" : " ",
                     fmt::join(request.arguments, " "), user, answer.error.empty() ? "done" : answer.error);
    return answer;
}

ControlAnswer ControlCommands::help(ControlRequest const& request)
{
    ControlAnswer answer;
    for (Command const* command = FIND({}); command->verb != nullptr; ++command)
        answer.lines.push_back(
            request.isJson
                ? CC_JsonLine()
                      .add("command", std::string_view(command->verb))
                      .add("usage", std::string_view(command->usage))
                      .add("what", std::string_view(command->what))
                      .get()
                : fmt::format("{:<46} {}", fmt::format("{} {}", command->verb, command->usage), command->what));
    return answer;
}

char const* ControlCommands::getPhase() const
{
    return m_host.isEnding ? "ending" : m_host.isDraining ? "draining" : "serving";
}

ControlAnswer ControlCommands::status(ControlRequest const& request)
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    Table table(request.isJson);
    table.add("state", std::string(getPhase()));
    table.add("calls", CallControl::GET_NUMBER_OF_CALLS());
    table.add("interfaces", m_interfaces.size());
    table.add("blocked", m_host.blocked.size());
    table.add("uptime-seconds", static_cast<unsigned long long>(now.seconds - m_start.seconds));
    table.add("pid", static_cast<unsigned long long>(getpid()));
    table.add("library", std::string(CALLCONTROL_LIBRARY_VERSION_STRING()));
    table.addFlag("recording", CC_Recorder::IS_ON());
    table.add("log-lines-dropped", GET_DROPPED_LOG_LINES());
    return table.get();
}

ControlAnswer ControlCommands::interfaces(ControlRequest const& request)
{
    ControlAnswer answer;
    for (auto const& [name, module] : m_interfaces)
    {
        bool const isBlocked = m_host.isBlocked(name);
        answer.lines.push_back(
            request.isJson ? CC_JsonLine()
                                 .add("interface", name)
                                 .add("module", module)
                                 .addJson("blocked", BOOLEAN(isBlocked))
                                 .get()
                           : fmt::format("{:<20} {:<8} {}", name, module, isBlocked ? "blocked" : "in service"));
    }
    for (auto const& [name, module] : m_modules)
    {
        std::istringstream text(module->describe());
        for (std::string line; std::getline(text, line);)
            answer.lines.push_back(request.isJson ? CC_JsonLine().add("module", name).add("text", line).get() : line);
    }
    return answer;
}

ControlAnswer ControlCommands::stats(ControlRequest const& request)
{
    CC_CallPool::Statistics& pool = CC_CallPool::s_statistics;
    pool.prepareGet();
    Table table(request.isJson);
    table.add("placed", m_host.counters.placed);
    table.add("answered", m_host.counters.answered);
    table.add("cleared", m_host.counters.cleared);
    table.add("failed", m_host.counters.failed);
    table.add("refused", m_host.counters.refused);
    table.add("up", CallControl::GET_NUMBER_OF_CALLS());
    table.add("most-at-once", pool.m_maxActiveCalls);
    table.add("calls-made", pool.m_callsAdded);
    table.add("calls-ended", pool.m_callsRemoved);
    table.add("call-milliseconds", pool.m_callTime);
    if (m_records != nullptr)
    {
        RecordWriter::Counters const records = m_records->getCounters();
        table.add("records-written", records.written);
        table.add("records-waiting", records.waiting);
        table.add("records-spooled", records.spooled);
        table.add("records-lost", records.lost);
    }
    return table.get();
}

ControlAnswer ControlCommands::drop(ControlRequest const& request)
{
    auto const serial = CONTROL_NUMBER(request.arguments[0]);
    auto const cause = CONTROL_NUMBER(request.arguments[1], HIGHEST_CAUSE);
    if (!serial || !cause || *cause == 0)
        return FAILED("drop wants the serial number of a call and a cause from 1 to 127");
    m_watch.noteCleared(*serial);
    bool isThere = false;
    for (auto const& [name, module] : m_modules)
        isThere |= module->clearCall(*serial, static_cast<QCause>(*cause));
    return isThere ? ControlAnswer() : FAILED("no call " + request.arguments[0] + " is up");
}

ControlAnswer ControlCommands::block(ControlRequest const& request)
{
    if (!m_interfaces.contains(request.arguments[0]))
        return FAILED("there is no interface '" + request.arguments[0] + "'");
    m_host.blocked.insert(request.arguments[0]);
    return {};
}

ControlAnswer ControlCommands::unblock(ControlRequest const& request)
{
    return m_host.blocked.erase(request.arguments[0]) != 0
               ? ControlAnswer()
               : FAILED("no interface '" + request.arguments[0] + "' is blocked");
}

ControlAnswer ControlCommands::drain(ControlRequest const&)
{
    m_host.isDraining = true;
    return {};
}

ControlAnswer ControlCommands::resume(ControlRequest const&)
{
    if (m_host.isEnding)
        return FAILED("the gateway is ending");
    m_host.isDraining = false;
    return {};
}

ControlAnswer ControlCommands::reload(ControlRequest const&) { return {{}, m_gateway.reload()}; }

ControlAnswer ControlCommands::shutDown(ControlRequest const& request)
{
    auto const option = request.options.find("graceful");
    if (option == request.options.end())
    {
        m_gateway.shutDown(std::nullopt);
        return {};
    }
    auto const seconds = CONTROL_NUMBER(option->second, MOST_SECONDS);
    if (!seconds)
        return FAILED("--graceful wants seconds, up to 86400");
    m_gateway.shutDown(static_cast<unsigned int>(*seconds));
    return {};
}
