#include "operation/record/SqliteStore.h"

#include <algorithm>
#include <sqlite3.h>
#include <stdexcept>
#include <sys/stat.h>

namespace
{
constexpr int PATIENCE = 1000; // milliseconds, for another process that has the file

struct StatementEnd
{
    void operator()(sqlite3_stmt* statement) const { sqlite3_finalize(statement); }
};

/// Who is busy or has no room now may take them later.
RecordStore::Result RESULT_OF(int code)
{
    return code == SQLITE_CONSTRAINT || code == SQLITE_ERROR || code == SQLITE_TOOBIG || code == SQLITE_MISMATCH
               ? RecordStore::Result::REFUSED
               : RecordStore::Result::AWAY;
}
} // namespace

void SqliteStore::Closer::operator()(sqlite3* database) const { sqlite3_close(database); }

SqliteStore::SqliteStore(std::string const& file)
{
    mode_t const before = umask(S_IRWXO); // of numbers
    sqlite3* database = nullptr;
    int const result = sqlite3_open(file.c_str(), &database);
    m_database.reset(database);
    sqlite3_busy_timeout(database, PATIENCE);
    bool const isGood = result == SQLITE_OK && execute("PRAGMA journal_mode=WAL") &&
                        execute("CREATE TABLE IF NOT EXISTS call_record (process TEXT NOT NULL, call INTEGER NOT NULL, "
                                "record TEXT NOT NULL, PRIMARY KEY (process, call)) WITHOUT ROWID");
    umask(before);
    if (!isGood)
        throw std::runtime_error(sqlite3_errmsg(database));
}

SqliteStore::~SqliteStore() = default;

RecordStore::Result SqliteStore::store(RecordLines const& lines)
{
    if (execute("BEGIN IMMEDIATE") &&
        std::all_of(lines.begin(), lines.end(), [this](std::string_view line) { return insert(line); }) &&
        execute("COMMIT"))
        return Result::STORED;
    Result const result = RESULT_OF(sqlite3_errcode(m_database.get()));
    m_reason = sqlite3_errmsg(m_database.get());
    execute("ROLLBACK");
    return result;
}

bool SqliteStore::insert(std::string_view line)
{
    sqlite3_stmt* prepared = nullptr;
    sqlite3_prepare_v2(m_database.get(),
                       "INSERT OR IGNORE INTO call_record "
                       "SELECT json_extract(?1, '$.process'), json_extract(?1, '$.call'), ?1",
                       -1, &prepared, nullptr);
    std::unique_ptr<sqlite3_stmt, StatementEnd> const statement(prepared);
    return sqlite3_bind_text(prepared, 1, line.data(), static_cast<int>(line.size()), SQLITE_STATIC) == SQLITE_OK &&
           sqlite3_step(prepared) == SQLITE_DONE;
}

bool SqliteStore::execute(char const* statement)
{
    return sqlite3_exec(m_database.get(), statement, nullptr, nullptr, nullptr) == SQLITE_OK;
}
