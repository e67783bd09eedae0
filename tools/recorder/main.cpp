// recorder: tells what happened to calls, from a recording of call control.

#include "diagnosis/CC_RecordingReport.h"

#include <charconv>
#include <cstdint>
#include <cstdio>
#include <new>
#include <string>
#include <string_view>
#include <vector>

namespace
{
constexpr int DONE = 0;
constexpr int FAILED = 1;
constexpr int MISUSED = 2; // one line on the error output says how

constexpr char const* USAGE =
    R"(usage: recorder calls FILE [OPTIONS]     one line a call: serial, state, age, numbers, cause
       recorder ladder FILE [OPTIONS]    the exchange between the legs of each call
       recorder history FILE --leg SERIAL --property NAME [OPTIONS]
                                         each value of a leg's property: time, turn, writer, filter
       recorder events FILE [OPTIONS]    every event, as JSON

options: --call SERIAL   that call alone (ladder, events)
         --json          JSON lines instead of text (ladder: the call's events)
         --whole         numbers and names that may not be presented as they are; otherwise they are withheld

FILE: what CC_Recorder::OPEN made, of a process that runs or of one that has ended; - reads the input
exit status: 0 done, 1 nothing could be read or found, 2 wrong use; what could not be read is told on the error output
)";

struct Arguments
{
    std::string verb;
    std::string file;
    std::uint64_t call = 0;
    std::uint64_t leg = 0;
    std::string property;
    bool isJson = false;
    bool isWhole = false;
};

int MISUSE(std::string const& message)
{
    std::fprintf(stderr, "recorder: %s\n%s", message.c_str(), USAGE);
    return MISUSED;
}

bool READ_SERIAL(std::string_view text, std::uint64_t& serial)
{
    auto const [stop, error] = std::from_chars(text.data(), text.data() + text.size(), serial);
    return error == std::errc() && stop == text.data() + text.size() && serial != 0;
}

/// Empty, or what is wrong.
std::string READ_OPTION(std::string_view option, char const* value, Arguments& arguments, bool& tookValue)
{
    tookValue = false;
    if (option == "--json")
        arguments.isJson = true;
    else if (option == "--whole")
        arguments.isWhole = true;
    else if (option == "--call" || option == "--leg" || option == "--property")
    {
        tookValue = true;
        if (value == nullptr)
            return std::string(option) + " wants a value";
        if (option == "--property")
            arguments.property = value;
        else if (!READ_SERIAL(value, option == "--call" ? arguments.call : arguments.leg))
            return std::string(option) + " wants a serial number";
    }
    else
        return "there is no option \"" + std::string(option) + "\"";
    return {};
}

std::string READ_ARGUMENTS(std::vector<char const*> const& given, Arguments& arguments)
{
    for (std::size_t i = 0; i < given.size(); ++i)
    {
        std::string_view const argument = given[i];
        if (argument.starts_with("--"))
        {
            bool tookValue = false;
            char const* const value = i + 1 < given.size() ? given[i + 1] : nullptr;
            if (std::string wrong = READ_OPTION(argument, value, arguments, tookValue); !wrong.empty())
                return wrong;
            i += tookValue ? 1 : 0;
        }
        else if (arguments.verb.empty())
            arguments.verb = argument;
        else if (arguments.file.empty())
            arguments.file = argument;
        else
            return "\"" + std::string(argument) + "\" is too much";
    }
    return arguments.file.empty() ? "a verb and a file are wanted" : std::string();
}

using Lines = CC_RecordingReport::Lines;

/// What the verb asks for; whether there is such a verb.
bool ANSWER(CC_RecordingReport const& report, Arguments const& arguments, Lines& lines)
{
    if (arguments.verb == "calls")
        lines = arguments.isJson ? report.getCallsJson() : report.getCalls();
    else if (arguments.verb == "history")
        lines = arguments.isJson ? report.getHistoryJson(arguments.leg, arguments.property)
                                 : report.getHistory(arguments.leg, arguments.property);
    else if (arguments.verb == "events" || (arguments.verb == "ladder" && arguments.isJson))
        lines = report.getJson(arguments.call);
    else if (arguments.verb == "ladder")
        lines = arguments.call != 0 ? report.getLadder(arguments.call) : report.getLadders();
    else
        return false;
    return true;
}

int RUN(Arguments const& arguments)
{
    if (arguments.verb == "history" && (arguments.leg == 0 || arguments.property.empty()))
        return MISUSE("history wants --leg and --property");
    CC_RecordingReport const report(
        CC_Recording::READ_FILE(arguments.file == "-" ? "/dev/stdin" : arguments.file.c_str()),
        arguments.isWhole ? CC_RecordingReport::Privacy::WHOLE : CC_RecordingReport::Privacy::MASKED);
    Lines lines;
    if (!ANSWER(report, arguments, lines))
        return MISUSE("there is no verb \"" + arguments.verb + "\"");
    std::string const& complaint = report.getRecording().getComplaint();
    if (!complaint.empty())
        std::fprintf(stderr, "recorder: %s: %s\n", arguments.file.c_str(), complaint.c_str());
    for (std::string const& line : lines)
        std::puts(line.c_str());
    return lines.empty() || report.getRecording().getEvents().empty() ? FAILED : DONE;
}
} // namespace

int main(int count, char** values)
{
    try
    {
        Arguments arguments;
        std::string const wrong = READ_ARGUMENTS({values + 1, values + count}, arguments);
        return wrong.empty() ? RUN(arguments) : MISUSE(wrong);
    }
    catch (std::bad_alloc const&)
    {
        std::fputs("recorder: out of memory\n", stderr);
        return FAILED;
    }
}
