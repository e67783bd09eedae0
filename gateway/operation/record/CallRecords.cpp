#include "operation/record/CallRecords.h"

#include "operation/record/PostgresqlStore.h"
#include "operation/record/RecordDelivery.h"
#include "operation/record/RecordFile.h"
#include "operation/record/SqliteStore.h"

#include <algorithm>
#include <chrono>
#include <exception>
#include <spdlog/spdlog.h>
#include <sys/stat.h>

namespace
{
std::int64_t SINCE_1970()
{
    return std::chrono::duration_cast<std::chrono::nanoseconds>(std::chrono::system_clock::now().time_since_epoch())
        .count();
}

/// What it throws is the key's fault.
template <class Open>
auto OPEN(char const* key, Open const& open)
try
{
    return open();
}
catch (std::runtime_error const& error)
{
    throw CallRecords::Failure(key, error.what());
}
} // namespace

CallRecords::CallRecords(RecordOptions const& options)
    : m_options(options), m_context{CallJson::PROCESS_OF(SINCE_1970()), options.isWhole}
{
    openJournal();
    LeftOvers left = m_journal != nullptr ? m_journal->getLeft() : LeftOvers();
    openFile(left);
    openDatabases();
    bring(left);
}

CallRecords::~CallRecords()
{
    std::size_t left = 0;
    for (Writer const& writer : m_writers)
        left += writer.writer->end();
    unsigned long long const lost = getCounters().lost + (m_journal != nullptr ? 0 : left);
    if (lost != 0)
        spdlog::error("{} records of calls are lost: {} takes no more", lost,
                      m_options.file.empty() ? "the disk" : m_options.file);
    if (m_journal != nullptr && left != 0)
        spdlog::warn("{} records of calls are for the next process to write: the disk takes no more", left);
}

void CallRecords::openJournal()
{
    if (m_options.spool.empty())
        return;
    mkdir(m_options.spool.c_str(), 0750); // if it is not there
    m_journal = OPEN("spool", [this] { return std::make_unique<CallJournal>(m_options.spool + "/calls.journal"); });
}

void CallRecords::openFile(LeftOvers& left)
{
    if (m_options.file.empty())
        return;
    auto file = OPEN("file", [this] { return std::make_unique<RecordFile>(m_options.file); });
    std::string const tail = left.empty() ? std::string() : file->getTail();
    for (CallJournal::Left& each : left)
        if (tail.find(CallJson::KEY_OF(each.line)) != std::string::npos)
        {
            m_journal->close(each.ticket, TO_FILE);
            each.owed &= ~TO_FILE;
        }
    addWriter(TO_FILE, std::move(file));
}

void CallRecords::openDatabases()
{
    if (!m_options.sqlite.empty())
    {
        auto store = OPEN("sqlite", [this] { return std::make_unique<SqliteStore>(m_options.sqlite); });
        addWriter(TO_SQLITE,
                  OPEN("spool",
                       [&] { return std::make_unique<RecordDelivery>("sqlite", std::move(store), m_options.spool); }));
    }
    if (!m_options.postgresql.empty())
        addWriter(TO_POSTGRESQL, OPEN("spool",
                                      [this]
                                      {
                                          return std::make_unique<RecordDelivery>(
                                              "postgresql", std::make_unique<PostgresqlStore>(m_options.postgresql),
                                              m_options.spool);
                                      }));
}

void CallRecords::addWriter(Target target, std::unique_ptr<RecordTarget> to)
{
    auto const onDone = [this, target](CallJournal::Ticket ticket)
    {
        if (m_journal != nullptr)
            m_journal->close(ticket, target);
    };
    m_writers.push_back({target, std::make_unique<RecordWriter>(std::move(to), m_options.kept, onDone)});
}

/// To those who have not got it, as far as they are still there.
void CallRecords::bring(LeftOvers const& left)
{
    for (CallJournal::Left const& each : left)
    {
        m_journal->close(each.ticket, each.owed & ~getTargets());
        for (Writer const& writer : m_writers)
            if ((each.owed & writer.target) != 0)
                writer.writer->write(each.line, each.ticket);
    }
    if (!left.empty())
        spdlog::warn("{} calls were not over, or not written, when the process before ended: there are records of "
                     "them",
                     left.size());
}

CallJournal::Owed CallRecords::getTargets() const
{
    CallJournal::Owed targets = 0;
    for (Writer const& writer : m_writers)
        targets |= writer.target;
    return targets;
}

/// Without memory it stays as it was: it is of use only if the process is killed.
void CallRecords::note(CallRecord const& record) noexcept
try
{
    if (m_journal == nullptr)
        return;
    std::string const line = CallJson::LINE_OF(record, m_context, CallJson::End::INTERRUPTED);
    auto const [known, isNew] = m_tickets.try_emplace(record.serial, CallJournal::NONE);
    if (known->second == CallJournal::NONE)
        known->second = m_journal->open(getTargets(), line);
    else
        m_journal->note(known->second, line);
}
catch (std::exception const&)
{
}

void CallRecords::write(CallRecord const& record)
{
    std::string const line = CallJson::LINE_OF(record, m_context);
    CallJournal::Ticket ticket = CallJournal::NONE;
    if (auto const known = m_tickets.find(record.serial); known != m_tickets.end())
    {
        ticket = known->second;
        m_tickets.erase(known);
    }
    if (ticket != CallJournal::NONE)
        m_journal->note(ticket, line);
    for (Writer const& writer : m_writers)
        writer.writer->write(line, ticket);
}

void CallRecords::reopen()
{
    for (Writer const& writer : m_writers)
        writer.writer->reopen();
}

bool CallRecords::hasRoom() const
{
    return std::all_of(m_writers.begin(), m_writers.end(),
                       [](Writer const& writer) { return writer.writer->hasRoom(); });
}

RecordWriter::Counters CallRecords::getCounters() const
{
    RecordWriter::Counters sum;
    for (Writer const& writer : m_writers)
    {
        RecordWriter::Counters const counters = writer.writer->getCounters();
        sum.written += counters.written;
        sum.waiting += counters.waiting;
        sum.spooled += counters.spooled;
        sum.lost += counters.lost;
    }
    return sum;
}
