#pragma once

#include "media/file/CallRecording.h"
#include "media/file/WaveFile.h"

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

/// Writes what is said in calls into files, a thread of its own: a disk that keeps us waiting delays no packet. A file
/// is made when the first frame comes, so a call in which nobody speaks leaves none.
///
/// Made, started and stopped on one thread; a writer that was not started is made to write by hand.
class RecordingWriter
{
public:
    /// Told once of each recording that came to nothing or lost something, on the writer's thread.
    using Failure = std::function<void(std::string const& path, std::string const& reason)>;

    RecordingWriter() = default;
    /// What waits is written, and every file closed.
    ~RecordingWriter();
    RecordingWriter(RecordingWriter const&) = delete;
    RecordingWriter& operator=(RecordingWriter const&) = delete;

    /// Before the start.
    void setFailure(Failure const& failure) { m_failure = failure; }
    void start();
    /// From any thread. Throws std::bad_alloc.
    void add(std::shared_ptr<CallRecording> const& recording);
    /// Everything that waits. Files of recordings that are over are closed.
    void write();

private:
    struct Entry
    {
        std::shared_ptr<CallRecording> recording;
        std::unique_ptr<WaveWriter> file; // null: nothing has come yet, or it has failed
        bool hasFailed = false;
    };
    void run();
    void takeNew();
    void write(Entry& entry);
    void fail(Entry& entry, char const* reason);

    Failure m_failure;
    std::mutex m_lock;
    std::condition_variable m_stopping;
    bool m_isStopping = false;
    std::vector<std::shared_ptr<CallRecording>> m_new;
    std::vector<Entry> m_entries; // the writing thread's
    std::thread m_thread;
};
