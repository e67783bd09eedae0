#pragma once

#include "operation/record/RecordStore.h"

#include <memory>

struct pg_conn;
struct pg_result;

/// Records in a database of PostgreSQL: the table call_record (process, call, record), where the record is its line. It
/// is made where it is not there.
class PostgresqlStore : public RecordStore
{
public:
    /// As libpq has the connection string. Connects when there is something to store. Throws std::runtime_error where
    /// libpq is not installed.
    explicit PostgresqlStore(std::string connection);
    ~PostgresqlStore() override;

    // --- RecordStore
    Result store(RecordLines const& lines) override;

private:
    struct Closer
    {
        void operator()(pg_conn* connection) const;
        void operator()(pg_result* result) const;
    };
    using Answer = std::unique_ptr<pg_result, Closer>;

    bool connect();
    bool makeTable();
    Answer ask(char const* statement, char const* parameter = nullptr);
    bool awaitSent();
    bool awaitAnswer();
    bool await(short events);
    bool isDone(Answer const& answer);
    Result fail(Answer const& answer);

    std::string m_options;
    std::unique_ptr<pg_conn, Closer> m_connection; // null: away
};
