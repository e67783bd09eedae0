#include "RecordCheck.h"

#include "Hex.h"
#include "RecordTypes.h"
#include "ValueReader.h"
#include "platform/asn1/AsnNotation.h"

namespace
{
std::string TRIM(std::string_view text)
{
    std::size_t const begin = text.find_first_not_of(" \t\r");
    if (begin == std::string_view::npos)
        return {};
    return std::string(text.substr(begin, text.find_last_not_of(" \t\r") + 1 - begin));
}

/// The parts of a line. The value may hold the separator inside quotes, so the last one ends it.
struct Example
{
    std::string name;
    std::string type;
    std::string value;
    std::string octets;
};

bool SPLIT(std::string const& line, Example& example)
{
    std::size_t const first = line.find('|');
    std::size_t const last = line.rfind('|');
    if (first == std::string::npos || first == last)
        return false;
    std::string_view const all(line);
    std::string_view const assignment = all.substr(first + 1, last - first - 1);
    std::size_t const sign = assignment.find("::=");
    if (sign == std::string_view::npos)
        return false;
    example.name = TRIM(all.substr(0, first));
    example.type = TRIM(assignment.substr(0, sign));
    example.value = TRIM(assignment.substr(sign + 3));
    example.octets = TRIM(all.substr(last + 1));
    return true;
}

std::string FAILURE_OF_ENCODING(char const* what, AsnSyntax const& value, std::vector<unsigned char> const& expected)
{
    AsnOctets octets;
    String error;
    if (!value.encode(octets, error).isOk())
        return std::string(what) + " does not encode: " + error.c_str();
    std::string const hex = Hex::WRITE(octets);
    return hex == Hex::WRITE(expected) ? "" : std::string(what) + " encodes to " + hex;
}

std::string FAILURE_OF_DECODING(AsnSyntax& decoded, Example const& example, std::vector<unsigned char> const& octets)
{
    String error;
    if (!decoded.decode(octets.data(), octets.size(), error).isOk())
        return std::string("does not decode: ") + error.c_str();
    String printed;
    if (!AsnNotation::VALUE_OF(decoded, printed).isOk())
        return "out of memory";
    if (printed.view() != example.value)
        return std::string("decodes to ") + printed.c_str();
    return FAILURE_OF_ENCODING("what is decoded", decoded, octets);
}
} // namespace

std::string RecordCheck::FAILURE_OF(std::string const& line)
{
    Example example;
    if (!SPLIT(line, example))
        return "is not \"name | Type ::= value | DER\"";
    std::unique_ptr<AsnSyntax> const decoded = RecordTypes::CREATE(example.type);
    std::unique_ptr<AsnSyntax> const read = RecordTypes::CREATE(example.type);
    if (decoded == nullptr || read == nullptr)
        return "there is no type \"" + example.type + "\"";
    auto const octets = Hex::READ(example.octets);
    if (!octets)
        return "the octets are not hexadecimal";
    std::string failure = FAILURE_OF_DECODING(*decoded, example, *octets);
    if (!failure.empty())
        return failure;
    ValueReader reader(example.value);
    if (!reader.readWhole(*read))
        return "the value does not read: " + reader.getError();
    if (!read->isEqual(*decoded))
        return "the value is not the one decoded";
    return FAILURE_OF_ENCODING("the value", *read, *octets);
}

void RecordCheck::run(std::istream& lines)
{
    for (std::string line; std::getline(lines, line);)
    {
        line = TRIM(line);
        if (line.empty() || line.front() == '#')
            continue;
        std::string const failure = FAILURE_OF(line);
        ++(failure.empty() ? m_passed : m_failed);
        if (!failure.empty())
            m_out << TRIM(line.substr(0, line.find('|'))) << ": " << failure << '\n';
    }
    m_out << m_passed << " passed, " << m_failed << " failed\n";
}
