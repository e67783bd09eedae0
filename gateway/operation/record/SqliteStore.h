#pragma once

#include "operation/record/RecordStore.h"

#include <memory>

struct sqlite3;

/// Records in a file of SQLite: the table call_record (process, call, record), where the record is its line.
class SqliteStore : public RecordStore
{
public:
    /// Throws std::runtime_error for a file that is of no use.
    explicit SqliteStore(std::string const& file);
    ~SqliteStore() override;

    // --- RecordStore
    Result store(RecordLines const& lines) override;

private:
    struct Closer
    {
        void operator()(sqlite3* database) const;
    };
    bool execute(char const* statement);
    bool insert(std::string_view line);

    std::unique_ptr<sqlite3, Closer> m_database;
};
