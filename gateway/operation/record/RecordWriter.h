#pragma once

#include "operation/record/CallJournal.h"
#include "operation/record/RecordTarget.h"

#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

/// Brings records of calls to where they go, on a thread of its own: whoever has one is never held up.
///
/// What is not taken, since a disk is full, waits in memory and is tried again every moment; beyond the configured
/// number the latest is lost, and counted.
///
///     RecordWriter writer(std::make_unique<RecordFile>("calls.jsonl"), 10000, onTaken);
///     writer.write("{...}", ticket);
class RecordWriter
{
public:
    struct Counters
    {
        unsigned long long written = 0;
        unsigned long long waiting = 0;
        unsigned long long spooled = 0;
        unsigned long long lost = 0;
    };
    using OnDone = std::function<void(CallJournal::Ticket)>;

    /// `onDone` is told of each record that is taken or lost, on any thread.
    RecordWriter(std::unique_ptr<RecordTarget> target, unsigned int kept, OnDone onDone);
    /// Brings away what waits, as far as that is possible at once.
    ~RecordWriter();
    RecordWriter(RecordWriter const&) = delete;
    RecordWriter& operator=(RecordWriter const&) = delete;

    /// Throws std::bad_alloc.
    void write(std::string line, CallJournal::Ticket ticket = CallJournal::NONE);
    /// Goes on in a file of the same name, after the one before was moved away.
    void reopen();
    /// Brings away what waits, as far as that is possible at once, and no more; tells how many are left.
    std::size_t end();
    bool hasRoom() const;
    Counters getCounters() const;

private:
    struct Item
    {
        std::string line;
        CallJournal::Ticket ticket;
    };
    void run();
    bool bring(std::unique_lock<std::mutex>& lock);
    bool bringSome(std::unique_lock<std::mutex>& lock);
    std::size_t take(RecordLines const& lines);
    void noteStuck(bool isStuck);
    bool deliver(std::unique_lock<std::mutex>& lock);

    std::unique_ptr<RecordTarget> m_target; // the thread's
    unsigned int m_kept;
    OnDone m_onDone;
    mutable std::mutex m_mutex;
    std::condition_variable m_changed;
    std::deque<Item> m_waiting;
    unsigned long long m_lost = 0;
    bool m_isReopening = false;
    bool m_isEnding = false;
    bool m_isStuck = false; // the thread's
    std::thread m_thread;
};
