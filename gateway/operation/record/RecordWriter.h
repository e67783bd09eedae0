#pragma once

#include "configuration/RecordOptions.h"
#include "operation/record/CallRecord.h"

#include <condition_variable>
#include <deque>
#include <mutex>
#include <string>
#include <thread>

/// Writes records of calls to a file, a line each, on a thread of its own: whoever has one is never held up.
///
/// What cannot be written, since the disk is full, waits in memory and is tried again every moment; beyond the
/// configured number the latest is lost, and counted. A line is in the file as a whole or not at all, as far as the
/// file lets itself be cut.
///
///     RecordWriter writer(options);
///     writer.write(record);
class RecordWriter
{
public:
    struct Counters
    {
        unsigned long long written = 0;
        unsigned long long waiting = 0;
        unsigned long long lost = 0;
    };

    /// Throws std::runtime_error when the file cannot be opened.
    explicit RecordWriter(RecordOptions const& options);
    /// Writes what waits, as far as that is possible at once; the rest is lost, and a line of the log says so.
    ~RecordWriter();
    RecordWriter(RecordWriter const&) = delete;
    RecordWriter& operator=(RecordWriter const&) = delete;

    /// Throws std::bad_alloc.
    void write(CallRecord const& record);
    /// Goes on in a file of the same name, after the one before was moved away.
    void reopen();
    bool hasRoom() const;
    Counters getCounters() const;

private:
    void run();
    void writeWaiting(std::unique_lock<std::mutex>& lock);
    bool writeLine(std::string const& line) const;
    void openAgain();

    RecordOptions m_options;
    int m_descriptor; // the thread's
    mutable std::mutex m_mutex;
    std::condition_variable m_changed;
    std::deque<CallRecord> m_waiting;
    Counters m_counters;
    bool m_isReopening = false;
    bool m_isEnding = false;
    std::thread m_thread;
};
