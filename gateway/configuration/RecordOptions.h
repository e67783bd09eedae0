#pragma once

#include <string>

/// Where records of calls go.
struct RecordOptions
{
    std::string file;               ///< of lines; empty: none
    std::string sqlite;             ///< the file of a database; empty: none
    std::string postgresql;         ///< the connection string of a database, which may have a password; empty: none
    std::string spool;              ///< the folder of what is still to be delivered; empty: none
    bool isWhole = false;           ///< numbers that may not be presented are written all the same
    unsigned int kept = 10000;      ///< records that are kept in memory when they cannot be written
    bool refusesUnrecorded = false; ///< no new calls when there is no room for their records

    /// Whether there are to be any.
    bool isOn() const { return !file.empty() || !sqlite.empty() || !postgresql.empty(); }

    friend bool operator==(RecordOptions const&, RecordOptions const&) = default;
};
