#pragma once

#include "operation/record/LineFile.h"

#include <string>
#include <vector>

/// Lines that wait in a file, which outlives the process, for somebody to take them in their order.
///
///     RecordSpool spool("/var/lib/gateway/records/calls.spool");
///     spool.append(line);
///     while (!spool.isEmpty())
///         ... // deliver spool.getFirst(100)
///         spool.drop();
class RecordSpool
{
public:
    /// Throws std::runtime_error when the file cannot be opened, or another process has it.
    explicit RecordSpool(std::string const& name);

    /// False: the disk takes no more.
    bool append(std::string_view line);
    bool isEmpty() const { return m_number == 0; }
    unsigned long long getNumber() const { return m_number; }
    /// Throws std::bad_alloc.
    std::vector<std::string> getFirst(std::size_t most);
    /// Those that were got last are delivered. A process that dies before it is told so will deliver them again.
    void drop();

private:
    LineFile m_file;
    off_t m_from = 0;                // what is before has been delivered
    off_t m_next = 0;                // after what was got
    unsigned long long m_number = 0; // of lines
    unsigned long long m_got = 0;
};
