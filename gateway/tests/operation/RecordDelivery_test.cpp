#include "operation/record/RecordDelivery.h"

#include "RecordsFixture.h"
#include "operation/record/CallJson.h"
#include "operation/record/RecordWriter.h"
#include "operation/record/SqliteStore.h"

#include <atomic>
#include <csignal>
#include <memory>
#include <mutex>
#include <sqlite3.h>
#include <sys/resource.h>

namespace
{
using Lines = std::vector<std::string>;

/// What a store that comes and goes has got.
struct Stored
{
    std::atomic<bool> isAway = false;
    std::atomic<unsigned int> tries = 0;
    std::mutex mutex;
    Lines lines;
};

/// Refuses what says "bad".
class StoreOfTest : public RecordStore
{
public:
    explicit StoreOfTest(Stored& stored) : m_stored(stored) {}
    Result store(RecordLines const& lines) override
    {
        ++m_stored.tries;
        if (m_stored.isAway)
            return Result::AWAY;
        for (std::string_view const line : lines)
            if (line.find("bad") != std::string_view::npos)
                return Result::REFUSED;
        std::lock_guard const lock(m_stored.mutex);
        m_stored.lines.insert(m_stored.lines.end(), lines.begin(), lines.end());
        return Result::STORED;
    }

private:
    Stored& m_stored;
};

class RecordDeliveryTest : public RecordsFixture
{
protected:
    std::unique_ptr<RecordWriter> makeWriter(unsigned int kept = 100)
    {
        return std::make_unique<RecordWriter>(
            std::make_unique<RecordDelivery>("test", std::make_unique<StoreOfTest>(stored), folder), kept,
            [](CallJournal::Ticket) {});
    }
    Lines getStored()
    {
        std::lock_guard const lock(stored.mutex);
        return stored.lines;
    }
    bool comes(Lines const& lines)
    {
        return WAIT_UNTIL([&] { return getStored() == lines; });
    }

    Stored stored;
};

TEST_F(RecordDeliveryTest, TriesTheStoreAtOnce)
{
    auto const writer = makeWriter();
    EXPECT_TRUE(WAIT_UNTIL([&] { return stored.tries > 0; }));
}

TEST_F(RecordDeliveryTest, BringsWhatCameWhileTheStoreWasAwayInItsOrder)
{
    auto const writer = makeWriter(1000);
    writer->write("1");
    ASSERT_TRUE(comes({"1"}));
    stored.isAway = true;
    Lines expected{"1"};
    for (int i = 2; i <= 250; ++i)
        writer->write(expected.emplace_back(std::to_string(i)));
    ASSERT_TRUE(WAIT_UNTIL([&] { return writer->getCounters().spooled == 249; }));
    EXPECT_EQ(writer->getCounters().waiting, 0u);
    EXPECT_EQ(LINES_OF(folder + "/test.spool").size(), 249u);
    stored.isAway = false;
    writer->write(expected.emplace_back("251"));
    EXPECT_TRUE(comes(expected));
    EXPECT_TRUE(WAIT_UNTIL([&] { return writer->getCounters().spooled == 0; }));
    EXPECT_EQ(std::filesystem::file_size(folder + "/test.spool"), 0u);
}

TEST_F(RecordDeliveryTest, LeavesToTheNextProcessWhatTheStoreDidNotTake)
{
    stored.isAway = true;
    auto writer = makeWriter();
    writer->write("1");
    writer->write(std::string(200000, 'x')); // longer than what is read at once
    writer.reset();
    stored.isAway = false;
    writer = makeWriter();
    EXPECT_TRUE(comes({"1", std::string(200000, 'x')}));
}

TEST_F(RecordDeliveryTest, SetsAsideWhatTheStoreRefuses)
{
    stored.isAway = true;
    auto const writer = makeWriter();
    for (char const* const line : {"1", "bad", "3"})
        writer->write(line);
    ASSERT_TRUE(WAIT_UNTIL([&] { return writer->getCounters().spooled == 3; }));
    stored.isAway = false;
    EXPECT_TRUE(comes({"1", "3"}));
    EXPECT_TRUE(WAIT_UNTIL([&] { return writer->getCounters().spooled == 0; }));
    EXPECT_EQ(LINES_OF(folder + "/test.refused"), Lines{"bad"});
}

/// Files of this process get no longer, as long as this lives.
class FullDisk
{
public:
    explicit FullDisk(rlim_t size)
    {
        std::signal(SIGXFSZ, SIG_IGN);
        getrlimit(RLIMIT_FSIZE, &m_before);
        rlimit const full{size, m_before.rlim_max};
        setrlimit(RLIMIT_FSIZE, &full);
    }
    ~FullDisk() { setrlimit(RLIMIT_FSIZE, &m_before); }
    FullDisk(FullDisk const&) = delete;
    FullDisk& operator=(FullDisk const&) = delete;

private:
    rlimit m_before = {};
};

TEST_F(RecordDeliveryTest, KeepsInMemoryWhatTheDiskDoesNotTakeAndHasNoMoreRoomThen)
{
    stored.isAway = true;
    auto const writer = makeWriter(3);
    Lines expected;
    {
        FullDisk const full(25);
        for (char const c : {'a', 'b'}) // of which two fit
            writer->write(expected.emplace_back(10, c));
        ASSERT_TRUE(WAIT_UNTIL([&] { return writer->getCounters().spooled == 2; }));
        for (char const c : {'c', 'd', 'e'})
            writer->write(expected.emplace_back(10, c));
        EXPECT_EQ(writer->getCounters().waiting, 3u);
        EXPECT_FALSE(writer->hasRoom());
        writer->write("lost");
        EXPECT_EQ(writer->getCounters().lost, 1u);
        EXPECT_EQ(LINES_OF(folder + "/test.spool").size(), 2u) << "and no piece of another one";
    }
    stored.isAway = false;
    EXPECT_TRUE(comes(expected));
    EXPECT_TRUE(WAIT_UNTIL([&] { return writer->hasRoom(); }));
}

/// Another program that has the database open.
struct Reader
{
    explicit Reader(std::string const& file) { sqlite3_open(file.c_str(), &database); }
    ~Reader() { sqlite3_close(database); }
    Reader(Reader const&) = delete;
    Reader& operator=(Reader const&) = delete;

    bool run(char const* statement)
    {
        return sqlite3_exec(database, statement, nullptr, nullptr, nullptr) == SQLITE_OK;
    }
    int count(char const* statement)
    {
        sqlite3_stmt* prepared = nullptr;
        sqlite3_prepare_v2(database, statement, -1, &prepared, nullptr);
        int const number = sqlite3_step(prepared) == SQLITE_ROW ? sqlite3_column_int(prepared, 0) : -1;
        sqlite3_finalize(prepared);
        return number;
    }
    sqlite3* database = nullptr;
};

class SqliteStoreTest : public RecordsFixture
{
protected:
    static std::string LINE(unsigned long long serial) { return CallJson::LINE_OF(RECORD(serial), {"now"}); }

    std::string file = folder + "/calls.sqlite";
};

TEST_F(SqliteStoreTest, HasEachRecordOnce)
{
    SqliteStore store(file);
    std::string const one = LINE(1);
    std::string const two = LINE(2);
    EXPECT_EQ(store.store({one}), RecordStore::Result::STORED);
    EXPECT_EQ(store.store({one, two}), RecordStore::Result::STORED);
    Reader reader(file);
    EXPECT_EQ(reader.count("SELECT count(*) FROM call_record"), 2);
    EXPECT_EQ(reader.count("SELECT call FROM call_record WHERE process = 'now' AND record ->> 'endedAfter' = 1.5 "
                           "ORDER BY call DESC"),
              2);
}

TEST_F(SqliteStoreTest, IsAwayAsLongAsSomebodyHasTheFileAndRefusesWhatIsNoRecord)
{
    SqliteStore store(file);
    Reader reader(file);
    ASSERT_TRUE(reader.run("BEGIN EXCLUSIVE"));
    std::string const line = LINE(1);
    EXPECT_EQ(store.store({line}), RecordStore::Result::AWAY);
    EXPECT_EQ(store.getReason(), "database is locked");
    ASSERT_TRUE(reader.run("ROLLBACK"));
    EXPECT_EQ(store.store({line, "{"}), RecordStore::Result::REFUSED);
    EXPECT_EQ(store.store({"{}"}), RecordStore::Result::STORED) << "ignored: it has no key";
    EXPECT_EQ(store.store({line}), RecordStore::Result::STORED);
    EXPECT_EQ(reader.count("SELECT count(*) FROM call_record"), 1);
}
} // namespace
