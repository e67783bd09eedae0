// gatewayctl: asks a running gateway what it is doing, and has it do something.
#include "Connection.h"
#include "Terminal.h"
#include "Top.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstdio>
#include <exception>
#include <string>
#include <vector>

namespace
{
/// Exit statuses.
constexpr int DONE = 0;
constexpr int REFUSED = 1; ///< by the gateway, with a reason
constexpr int MISUSED = 2;
constexpr int NO_ANSWER = 3; ///< nobody listens, or the answer has no end

constexpr char const* DEFAULT_SOCKET = "/run/callcontrol-gateway/control";

int COMPLAIN(int status, std::string const& what)
{
    std::fprintf(stderr, "gatewayctl: %s\n", what.c_str());
    return status;
}

/// The words as the line that the gateway takes; empty when they cannot be one.
std::string LINE_OF(std::vector<std::string> const& words)
{
    std::string line;
    for (std::string const& word : words)
    {
        if (word.empty() || word.find_first_of(" \t\r\n") != std::string::npos)
            return {};
        line += (line.empty() ? "" : " ") + word;
    }
    return line;
}

int ASK(std::string const& socket, std::string const& line)
{
    Connection connection(socket);
    connection.send(line);
    std::optional<std::string> const status = connection.receive();
    if (!status)
        return COMPLAIN(NO_ANSWER, "no answer");
    bool const isOk = Connection::IS_OK(*status);
    if (!isOk)
        COMPLAIN(REFUSED, *status);
    for (std::optional<std::string> next = connection.receive(); next; next = connection.receive())
        if (next->empty())
            return isOk ? DONE : REFUSED;
        else
            std::puts(next->c_str());
    return COMPLAIN(NO_ANSWER, "the answer is cut off");
}

/// "top", perhaps with an order, where somebody looks on: drawn again and again.
bool IS_LIVE(std::vector<std::string> const& words)
{
    return words.front() == "top" && (words.size() == 1 || (words.size() == 3 && words[1] == "--sort")) &&
           Terminal::IS_THERE();
}

int SHOW(std::string const& socket, std::string const& order)
{
    Connection connection(socket);
    std::string const refusal = Top(order).run(connection);
    return refusal.empty() ? DONE : COMPLAIN(REFUSED, refusal);
}

int START(int argc, char** argv)
{
    CLI::App app("Asks a running callcontrol-gateway: gatewayctl COMMAND [ARGUMENTS]; the command help lists them");
    std::string socket = DEFAULT_SOCKET;
    bool isJson = false;
    app.add_option("-s,--socket", socket, "The gateway's socket")->envname("CALLCONTROL_GATEWAY_SOCKET");
    app.add_flag("--json", isJson, "JSON lines instead of text");
    app.prefix_command(); // what follows the command is the gateway's
    try
    {
        app.parse(argc, argv);
    }
    catch (CLI::Success const& help)
    {
        return app.exit(help);
    }
    catch (CLI::Error const& error)
    {
        return COMPLAIN(MISUSED, error.what());
    }
    std::vector<std::string> words = app.remaining();
    if (isJson)
        words.emplace_back("--json");
    std::string const line = LINE_OF(words);
    if (words.empty() || words.front().starts_with("-") || line.empty())
        return COMPLAIN(MISUSED, "a command is wanted, and no word of it may have blanks; --help tells more");
    if (IS_LIVE(words))
        return SHOW(socket, words.size() == 3 ? words[2] : "age");
    return ASK(socket, line);
}
} // namespace

int main(int argc, char** argv)
{
    try
    {
        return START(argc, argv);
    }
    catch (std::exception const& error)
    {
        return COMPLAIN(NO_ANSWER, error.what());
    }
}
