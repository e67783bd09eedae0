#pragma once

#include "operation/record/CallRecord.h"

#include <cstdint>
#include <string>
#include <string_view>

/// A record as a JSON object on one line: call-record.schema.json says what it has.
namespace CallJson
{
constexpr unsigned int VERSION = 2; ///< of what the schema describes

/// What every record of this process says.
struct Context
{
    std::string process;  ///< PROCESS_OF() its start
    bool isWhole = false; ///< with numbers and names that may not be presented, which are null otherwise
};
enum class End
{
    KNOWN,
    INTERRUPTED ///< the process ends before the call does
};

/// Without a line break. Any thread.
std::string LINE_OF(CallRecord const& record, Context const& context, End end = End::KNOWN);
/// Names a process that was started so many nanoseconds after 1970.
std::string PROCESS_OF(std::int64_t start);
/// The beginning of the line, which no record of another call has.
std::string_view KEY_OF(std::string_view line);
} // namespace CallJson
