#pragma once

#include <string>

/// Where records of calls go.
struct RecordOptions
{
    std::string file;               ///< empty: nowhere
    bool isWhole = false;           ///< numbers that may not be presented are written all the same
    unsigned int kept = 10000;      ///< records that are kept in memory when they cannot be written
    bool refusesUnrecorded = false; ///< no new calls when there is no room for their records

    friend bool operator==(RecordOptions const&, RecordOptions const&) = default;
};
