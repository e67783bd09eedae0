#include "sip/registrar/SipBindingStore.h"

#include <chrono>
#include <csignal>
#include <memory>
#include <sqlite3.h>
#include <sys/stat.h>

namespace
{
constexpr int PATIENCE = 1000; // milliseconds, for another process that has the file
constexpr auto PAUSE = std::chrono::seconds(1);
constexpr auto GATHERING = std::chrono::milliseconds(100);

struct Finalizer
{
    void operator()(sqlite3_stmt* statement) const { sqlite3_finalize(statement); }
};
using Statement = std::unique_ptr<sqlite3_stmt, Finalizer>;

Statement PREPARE(sqlite3* database, char const* text)
{
    sqlite3_stmt* statement = nullptr;
    sqlite3_prepare_v2(database, text, -1, &statement, nullptr);
    return Statement(statement); // null is refused by whatever uses it
}

void BIND(Statement const& statement, int place, std::string const& text)
{
    sqlite3_bind_text(statement.get(), place, text.data(), static_cast<int>(text.size()), SQLITE_TRANSIENT);
}

std::string TEXT(Statement const& statement, int column)
{
    auto const* const text = reinterpret_cast<char const*>(sqlite3_column_text(statement.get(), column));
    return text != nullptr ? text : "";
}

/// Once, and ready for the next time.
bool RUN(Statement const& statement)
{
    bool const isDone = sqlite3_step(statement.get()) == SQLITE_DONE;
    sqlite3_reset(statement.get());
    return isDone;
}

/// The columns from the third on.
bool WRITE(Statement const& row, SipBinding const& binding, std::size_t place)
{
    BIND(row, 3, binding.uri);
    BIND(row, 4, binding.callId);
    sqlite3_bind_int64(row.get(), 5, binding.sequence);
    sqlite3_bind_int64(row.get(), 6, binding.preference);
    sqlite3_bind_int64(row.get(), 7, binding.until);
    sqlite3_bind_int64(row.get(), 8, static_cast<sqlite3_int64>(place));
    BIND(row, 9, binding.called);
    BIND(row, 10, binding.route);
    return RUN(row);
}

/// Signals are the main thread's.
class WithoutSignals
{
public:
    WithoutSignals()
    {
        sigset_t all;
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, &m_before);
    }
    ~WithoutSignals() { pthread_sigmask(SIG_SETMASK, &m_before, nullptr); }
    WithoutSignals(WithoutSignals const&) = delete;
    WithoutSignals& operator=(WithoutSignals const&) = delete;

private:
    sigset_t m_before = {};
};
} // namespace

SipBindingStore::SipBindingStore(std::string const& file, std::string interface,
                                 std::function<void(std::string const&, SipBinding const&)> const& restore)
    : m_interface(std::move(interface))
{
    mode_t const before = umask(S_IRWXG | S_IRWXO); // where users are is nobody else's business
    int const result = sqlite3_open(file.c_str(), &m_database);
    sqlite3_busy_timeout(m_database, PATIENCE);
    bool const isGood = result == SQLITE_OK && execute("PRAGMA journal_mode=WAL") &&
                        execute("PRAGMA synchronous=NORMAL") &&
                        execute("CREATE TABLE IF NOT EXISTS binding (interface TEXT NOT NULL, user TEXT NOT NULL, "
                                "uri TEXT NOT NULL, call_id TEXT NOT NULL, sequence INTEGER NOT NULL, "
                                "preference INTEGER NOT NULL, until INTEGER NOT NULL, place INTEGER NOT NULL, "
                                "called TEXT NOT NULL DEFAULT '', route TEXT NOT NULL DEFAULT '', "
                                "PRIMARY KEY (interface, user, uri))");
    execute("ALTER TABLE binding ADD COLUMN called TEXT NOT NULL DEFAULT ''"); // refused where it has that already
    execute("ALTER TABLE binding ADD COLUMN route TEXT NOT NULL DEFAULT ''");  // likewise
    umask(before);
    if (!isGood)
    {
        std::string const reason = sqlite3_errmsg(m_database);
        sqlite3_close(m_database);
        throw Failure(file + ": " + reason);
    }
    load(restore);
    WithoutSignals const masked;
    m_thread = std::thread([this] { run(); });
}

SipBindingStore::~SipBindingStore()
{
    {
        std::lock_guard const lock(m_mutex);
        m_isEnding = true;
    }
    m_wake.notify_one();
    m_thread.join();
    sqlite3_close(m_database);
}

void SipBindingStore::write(std::string const& user, std::vector<SipBinding> bindings, bool mayWait)
{
    {
        std::lock_guard const lock(m_mutex);
        bool const isAwake = !m_changes.empty() && mayWait; // or will be
        m_changes[user] = std::move(bindings);
        m_isUrgent = m_isUrgent || !mayWait;
        if (isAwake)
            return;
    }
    m_wake.notify_one();
}

void SipBindingStore::load(std::function<void(std::string const&, SipBinding const&)> const& restore)
{
    Statement const rows =
        PREPARE(m_database, "SELECT user, uri, call_id, sequence, preference, until, called, route FROM binding "
                            "WHERE interface = ? AND until > ? ORDER BY user, place");
    BIND(rows, 1, m_interface);
    sqlite3_bind_int64(rows.get(), 2, SipBindings::NOW());
    while (sqlite3_step(rows.get()) == SQLITE_ROW)
        restore(TEXT(rows, 0),
                {TEXT(rows, 1), TEXT(rows, 2), static_cast<std::uint32_t>(sqlite3_column_int64(rows.get(), 3)),
                 static_cast<unsigned int>(sqlite3_column_int64(rows.get(), 4)), sqlite3_column_int64(rows.get(), 5),
                 TEXT(rows, 6), TEXT(rows, 7)});
}

void SipBindingStore::run()
{
    std::unique_lock lock(m_mutex);
    while (true)
    {
        m_wake.wait(lock, [this] { return m_isEnding || !m_changes.empty(); });
        if (m_changes.empty())
            return;
        m_wake.wait_for(lock, GATHERING, [this] { return m_isEnding || m_isUrgent; });
        Changes changes;
        changes.swap(m_changes);
        m_isUrgent = false;
        lock.unlock();
        bool const isWritten = writeAll(changes);
        lock.lock();
        if (isWritten)
            continue;
        ++m_failures;
        if (m_isEnding)
            return;
        m_changes.merge(changes); // what came meanwhile is newer
        m_wake.wait_for(lock, PAUSE, [this] { return m_isEnding; });
    }
}

bool SipBindingStore::writeAll(Changes const& changes)
{
    Statement const removal = PREPARE(m_database, "DELETE FROM binding WHERE interface = ? AND user = ?");
    Statement const row =
        PREPARE(m_database, "INSERT INTO binding (interface, user, uri, call_id, sequence, preference, "
                            "until, place, called, route) VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?)");
    bool isGood = execute("BEGIN IMMEDIATE");
    for (auto change = changes.begin(); isGood && change != changes.end(); ++change)
    {
        auto const& [user, bindings] = *change;
        BIND(removal, 1, m_interface);
        BIND(removal, 2, user);
        isGood = RUN(removal);
        for (std::size_t i = 0; isGood && i < bindings.size(); ++i)
        {
            BIND(row, 1, m_interface);
            BIND(row, 2, user);
            isGood = WRITE(row, bindings[i], i);
        }
    }
    if (isGood && execute("COMMIT"))
        return true;
    execute("ROLLBACK");
    return false;
}

bool SipBindingStore::execute(char const* statement)
{
    return sqlite3_exec(m_database, statement, nullptr, nullptr, nullptr) == SQLITE_OK;
}
