#pragma once

#include <istream>
#include <ostream>
#include <string>

/// Checks lines of examples: `name | Type ::= value | DER in hexadecimal`. Empty lines and lines that begin with # are
/// passed over.
///
///     RecordCheck check(std::cout);
///     check.run(file); // prints what fails
///     return check.getNumberOfFailures() == 0 ? 0 : 1;
class RecordCheck
{
public:
    explicit RecordCheck(std::ostream& out) : m_out(out) {}

    /// Prints a line for each example that fails, and at last how many passed and failed.
    void run(std::istream& lines);
    /// Why the line fails, empty when it does not. The octets must decode, encode to themselves again and print the
    /// line's value; the value must read, equal the decoded one and encode to the octets.
    static std::string FAILURE_OF(std::string const& line);

    unsigned int getNumberOfPasses() const { return m_passed; }
    unsigned int getNumberOfFailures() const { return m_failed; }

private:
    std::ostream& m_out;
    unsigned int m_passed = 0;
    unsigned int m_failed = 0;
};
