#pragma once

#include "configuration/RecordOptions.h"
#include "operation/record/CallJournal.h"
#include "operation/record/CallJson.h"
#include "operation/record/CallRecord.h"
#include "operation/record/RecordWriter.h"

#include <memory>
#include <stdexcept>
#include <string>
#include <unordered_map>
#include <vector>

class RecordFile;

/// The records of calls on their way to wherever the configuration says: a file, databases. With a folder for what is
/// not delivered yet, a process that is killed leaves what it knew of its calls there, and the next one makes records
/// of it.
///
///     CallRecords records(options);
///     records.note(record); // as it is now
///     records.write(record); // it is over
class CallRecords
{
public:
    /// What cannot be had, by its key in the configuration.
    struct Failure : std::runtime_error
    {
        Failure(std::string const& failedKey, std::string const& reason) : runtime_error(reason), key(failedKey) {}
        std::string key;
    };

    /// Throws Failure.
    explicit CallRecords(RecordOptions const& options);
    /// Brings away what can be at once; a line of the log tells what becomes of the rest.
    ~CallRecords();
    CallRecords(CallRecords const&) = delete;
    CallRecords& operator=(CallRecords const&) = delete;

    /// What is known so far of a call that is up.
    void note(CallRecord const& record) noexcept;
    /// Throws std::bad_alloc.
    void write(CallRecord const& record);
    /// Files were moved away.
    void reopen();
    /// Whether each of the targets has room for another one.
    bool hasRoom() const;
    /// Of all targets together.
    RecordWriter::Counters getCounters() const;

private:
    /// In the journal, so these stay what they are.
    enum Target : CallJournal::Owed
    {
        TO_FILE = 1,
        TO_SQLITE = 2,
        TO_POSTGRESQL = 4
    };
    struct Writer
    {
        Target target;
        std::unique_ptr<RecordWriter> writer;
    };
    using LeftOvers = std::vector<CallJournal::Left>;

    void openJournal();
    void openFile(LeftOvers& left);
    void openDatabases();
    void addWriter(Target target, std::unique_ptr<RecordTarget> to);
    void bring(LeftOvers const& left);
    CallJournal::Owed getTargets() const;

    RecordOptions m_options;
    CallJson::Context m_context;
    std::unique_ptr<CallJournal> m_journal;                                // null without a folder
    std::unordered_map<unsigned long long, CallJournal::Ticket> m_tickets; // by a call's number
    std::vector<Writer> m_writers;
};
