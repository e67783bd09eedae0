#pragma once

#include "operation/record/CallRecord.h"

#include <string>

/// A record as a JSON object on one line: call-record.schema.json says what it has.
namespace CallJson
{
constexpr unsigned int VERSION = 1; ///< of what the schema describes

/// `isWhole`: with numbers and names that may not be presented, which are null otherwise. Without a line break. Any
/// thread.
std::string LINE_OF(CallRecord const& record, bool isWhole);
} // namespace CallJson
