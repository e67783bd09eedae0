#include "tests/simulation/Operation.h"

#include "tests/simulation/CallOut.h"

#include <algorithm>
#include <cstring>
#include <sstream>

namespace Simulation
{
namespace
{
constexpr auto NUMBER_OF_CODES = static_cast<std::size_t>(Code::NUMBER_OF_CODES);

struct Row
{
    char const* name;
    char const* meaning; // %0 to %6: the arguments; %k, %o, %n: of `when`
};

constexpr Row ROWS[] = {
    {"world", "%0+2 modules, E.164 lines %1, shared networks %2, overriding lines %3, contexts %4, flavour %5"},
    {"turn", "the loop turns %0+1 times (at most 3)"},
    {"settle", "the loop turns until nothing is left to do"},
    {"advance-clock", "%0 times 7 milliseconds"},
    {"dial", "line %0 dials module %1 in context %2, own properties %3, others %4, way %5, number %6"},
    {"accept", "line %0 accepts call %1/%2 with properties %3"},
    {"reject", "module %0 rejects call %1/%2 with cause %3"},
    {"answer-mode", "module %0 answers offers in the way %1, with cause %2"},
    {"become", "line %0 writes its own state, value %1"},
    {"set-own", "line %0 writes property %1, value %2, way %3, with others %4"},
    {"set-peer", "line %0 writes the peer's property %1, value %2, way %3, with others %4"},
    {"set-call", "line %0 writes the call's property %1, value %2, way %3, with others %4"},
    {"service", "line %0 asks service %1, text %2"},
    {"transfer", "line %0 takes over line %1's call, removing its own leg %2"},
    {"drop", "line %0 drops with cause %1, companion %2"},
    {"cleanup", "line %0 cleans up"},
    {"setup", "line %0 is set up, observer %1"},
    {"destroy-adapter", "line %0's adapter"},
    {"make-adapter", "line %0 gets an adapter of kind %1"},
    {"acquire", "a call from context %0, media context %1"},
    {"release", "call %1 of context %0"},
    {"drop-calls", "of context %0, all or call %1 (way %2)"},
    {"new-leg", "guest leg %0, id %1, state %2"},
    {"add-leg", "guest leg %0 to call %1/%2"},
    {"move-leg", "guest leg %0 to call %1/%2, or out of all (way %3)"},
    {"remove-leg", "guest leg %0 out of its call, asked of call %1/%2"},
    {"set-leg", "guest leg %0, property %1, value %2, way %3, with others %4"},
    {"give-up-leg", "guest leg %0"},
    {"leg-service", "guest leg %0 asks service %1, text %2"},
    {"set-on-call", "call %0/%1, property %2, value %3, way %4, with others %5"},
    {"empty-call", "call %0/%1"},
    {"clean-up-call", "call %0/%1, at once or not, the guests holding nothing or as ever (way %2)"},
    {"create-context", "context %0"},
    {"destroy-context", "context %0"},
    {"add-provider", "module %0's to context %1"},
    {"remove-provider", "module %0's from context %1"},
    {"destroy-module", "module %0"},
    {"make-module", "module %0"},
    {"change-filters", "module %0, direction %1, way %2, filter %3, parameter %4, place %5"},
    {"use-filters", "module %0, direction %1, in use %2"},
    {"observe", "guest %0 observes the kind %1, object %2/%3"},
    {"stop-observing", "guest %0, the kind %1, object %2/%3"},
    {"when", "at the coming call-out %k, after %o others, the next %n operations are carried out inside"},
    {"fail-allocation", "of the next operation, the one after %0 others"},
    {"other-thread", "does %0 with guest leg %1 and is joined"},
    {"media-mode", "%0"},
    {"reboot-mode", "%0"},
    {"log-level", "%0"},
    {"dump", "%0 of line %1, call %2/%3"},
    {"read", "line %0's properties, way %1, mask %2, id %3"},
    {"reset-statistics", ""},
    {"set-name", "of line %0, text %1"},
    {"set-datapath", "of line %0, media context %1"},
    {"offer", "module %0 is offered call %1/%2 with properties %3"},
    {"answer-held", "module %0 answers the offer that it holds, line %1, way %2"},
    {"new-call", "without a pool, with guest leg %0, or the end of the last one (way %1)"},
    {"change-untold", "line or guest leg %0, property %1, value %2, way %3"},
    {"accessor", "line %0, accessor %1, value %2"},
    {"keep-blocks", "%0"},
    {"set-options", "context %0, option %1, value %2"},
};
static_assert(std::size(ROWS) == NUMBER_OF_CODES);

std::string MEANING(Operation const& operation)
{
    std::string text;
    for (char const* letter = ROWS[static_cast<std::size_t>(operation.code)].meaning; *letter != '\0'; ++letter)
    {
        if (*letter != '%')
            text += *letter;
        else if (*++letter == 'k')
            text += NAME_OF(CALL_OUT_OF(operation[0]));
        else if (*letter == 'o')
            text += std::to_string(operation[1] % MOST_OTHERS);
        else if (*letter == 'n')
            text += std::to_string(1 + operation[2] % MOST_INSIDE);
        else
            text += std::to_string(operation[static_cast<std::size_t>(*letter - '0')]);
    }
    return text;
}

bool FIND_CODE(std::string const& name, Code& code)
{
    for (std::size_t i = 0; i < NUMBER_OF_CODES; ++i)
        if (name == ROWS[i].name)
        {
            code = static_cast<Code>(i);
            return true;
        }
    return false;
}

bool READ_LINE(std::string const& line, Operations& operations)
{
    std::istringstream stream(line.substr(0, line.find('#')));
    std::string name;
    if (!(stream >> name))
        return true;
    Operation operation;
    if (!FIND_CODE(name, operation.code))
        return false;
    unsigned int value = 0;
    for (std::size_t i = 0; stream >> value; ++i)
    {
        if (i == Operation::NUMBER_OF_ARGUMENTS || value > 0xff)
            return false;
        operation.arguments[i] = static_cast<std::uint8_t>(value);
    }
    operations.push_back(operation);
    return stream.eof();
}
} // namespace

Operations FROM_OCTETS(std::uint8_t const* octets, std::size_t size)
{
    Operations operations;
    for (std::size_t i = 0; i + Operation::SIZE <= size; i += Operation::SIZE)
    {
        Operation operation;
        operation.code = static_cast<Code>(octets[i] % NUMBER_OF_CODES);
        std::copy_n(octets + i + 1, Operation::NUMBER_OF_ARGUMENTS, operation.arguments.begin());
        operations.push_back(operation);
    }
    return operations;
}

std::vector<std::uint8_t> TO_OCTETS(Operations const& operations)
{
    std::vector<std::uint8_t> octets;
    for (Operation const& operation : operations)
    {
        octets.push_back(static_cast<std::uint8_t>(operation.code));
        octets.insert(octets.end(), operation.arguments.begin(), operation.arguments.end());
    }
    return octets;
}

std::string TO_LINE(Operation const& operation)
{
    std::size_t used = Operation::NUMBER_OF_ARGUMENTS;
    while (used > 0 && operation[used - 1] == 0)
        --used;
    std::string line = NAME_OF(operation.code);
    for (std::size_t i = 0; i < used; ++i)
        line += " " + std::to_string(operation[i]);
    std::string const meaning = MEANING(operation);
    if (meaning.empty())
        return line;
    line.resize(std::max<std::size_t>(line.size(), 36), ' ');
    return line + " # " + meaning;
}

std::string TO_TEXT(Operations const& operations, std::string const& remarks)
{
    std::string text;
    std::istringstream lines(remarks);
    for (std::string line; std::getline(lines, line);)
        text += "# " + line + "\n";
    for (Operation const& operation : operations)
        text += TO_LINE(operation) + "\n";
    return text;
}

bool FROM_TEXT(std::string const& text, Operations& operations, std::string& error)
{
    std::istringstream lines(text);
    unsigned int number = 0;
    for (std::string line; std::getline(lines, line);)
    {
        ++number;
        if (READ_LINE(line, operations))
            continue;
        error = "line " + std::to_string(number) + ": " + line;
        return false;
    }
    return true;
}

char const* NAME_OF(Code code) { return ROWS[static_cast<std::size_t>(code)].name; }
} // namespace Simulation
