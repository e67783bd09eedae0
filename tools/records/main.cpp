// records: looks into charge, tariff and quality-of-service records.

#include "Hex.h"
#include "RecordCheck.h"
#include "RecordTypes.h"
#include "platform/asn1/AsnNotation.h"

#include <fstream>
#include <iostream>
#include <new>

namespace
{
constexpr int DONE = 0;
constexpr int FAILED = 1;
constexpr int MISUSED = 2; // one line on the error output says how

constexpr char const* USAGE = R"(usage: records decode TYPE HEX    print the value, its text and its encoding
       records check FILE         check lines "name | Type ::= value | DER in hexadecimal"
       records notation TYPE      print the type's definition
       records types              print the names of the types

exit status: 0 done, 1 the octets are no value of the type or an example failed, 2 wrong use
)";

int MISUSE(std::string const& message)
{
    std::cerr << "records: " << message << '\n';
    return MISUSED;
}

int FAIL(char const* message)
{
    std::cerr << "records: " << message << '\n';
    return FAILED;
}

int DECODE(char const* type, char const* hex)
{
    std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(type);
    if (value == nullptr)
        return MISUSE(std::string("there is no type \"") + type + "\"");
    auto const octets = Hex::READ(hex);
    if (!octets)
        return MISUSE("the octets must be pairs of hexadecimal digits");
    String error;
    if (!value->decode(octets->data(), octets->size(), error).isOk())
        return FAIL(error.c_str());
    String notation;
    AsnOctets encoded;
    if (!AsnNotation::VALUE_OF(*value, notation).isOk() || !value->encode(encoded, error).isOk())
        return FAIL("out of memory");
    std::cout << "value: " << AsnNotation::NAME_OF(*value) << " ::= " << notation.view() << '\n';
    String text;
    if (RecordTypes::TEXT_OF(*value, text))
    {
        bool const isTree = text.view().find('\n') != std::string_view::npos;
        std::cout << (isTree ? "text:\n" : "text: ") << text.view() << (isTree ? "" : "\n");
    }
    std::cout << "DER: " << Hex::WRITE(encoded) << '\n';
    return DONE;
}

int CHECK(char const* path)
{
    std::ifstream file(path);
    if (!file)
        return MISUSE(std::string("cannot read ") + path);
    file.peek(); // a folder opens, but nothing can be read from it
    if (file.bad())
        return MISUSE(std::string("cannot read ") + path);
    RecordCheck check(std::cout);
    check.run(file);
    return check.getNumberOfFailures() == 0 ? DONE : FAILED;
}

int PRINT_NOTATION(char const* type)
{
    std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(type);
    if (value == nullptr)
        return MISUSE(std::string("there is no type \"") + type + "\"");
    String notation;
    if (!AsnNotation::TYPE_OF(*value, notation).isOk())
        return FAIL("out of memory");
    std::cout << notation.view() << '\n';
    return DONE;
}

int PRINT_TYPES()
{
    for (char const* const name : RecordTypes::NAMES())
        std::cout << name << '\n';
    return DONE;
}

int RUN(int count, char** arguments)
{
    std::string_view const verb = count > 1 ? arguments[1] : "";
    if (verb == "decode" && count == 4)
        return DECODE(arguments[2], arguments[3]);
    if (verb == "check" && count == 3)
        return CHECK(arguments[2]);
    if (verb == "notation" && count == 3)
        return PRINT_NOTATION(arguments[2]);
    if (verb == "types" && count == 2)
        return PRINT_TYPES();
    if ((verb == "--help" || verb == "-h") && count == 2)
    {
        std::cout << USAGE;
        return DONE;
    }
    std::cerr << USAGE;
    return MISUSED;
}
} // namespace

int main(int count, char** arguments)
{
    try
    {
        return RUN(count, arguments);
    }
    catch (std::bad_alloc const&)
    {
        return FAIL("out of memory");
    }
}
