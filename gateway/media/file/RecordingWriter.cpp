#include "media/file/RecordingWriter.h"

#include <cerrno>
#include <cstring>

namespace
{
constexpr std::chrono::milliseconds PERIOD{200};
} // namespace

RecordingWriter::~RecordingWriter()
{
    if (m_thread.joinable())
    {
        {
            std::lock_guard const lock(m_lock);
            m_isStopping = true;
        }
        m_stopping.notify_one();
        m_thread.join();
    }
    write();
}

void RecordingWriter::start()
{
    m_thread = std::thread([this] { run(); });
}

void RecordingWriter::run()
{
    std::unique_lock lock(m_lock);
    while (!m_stopping.wait_for(lock, PERIOD, [this] { return m_isStopping; }))
    {
        lock.unlock();
        write();
        lock.lock();
    }
}

void RecordingWriter::add(std::shared_ptr<CallRecording> const& recording)
{
    std::lock_guard const lock(m_lock);
    m_new.push_back(recording);
}

void RecordingWriter::takeNew()
{
    std::lock_guard const lock(m_lock);
    for (std::shared_ptr<CallRecording> const& recording : m_new)
        m_entries.push_back({recording, nullptr});
    m_new.clear();
}

void RecordingWriter::write()
try
{
    takeNew();
    for (Entry& entry : m_entries)
        write(entry);
    std::erase_if(m_entries, [](Entry const& entry) { return entry.recording == nullptr; });
}
catch (std::bad_alloc const&)
{
    // what waits is written the next time
}

void RecordingWriter::write(Entry& entry)
{
    bool const isOver = entry.recording->isOver(); // what was put before that comes now
    while (CallRecording::Frame const* const frame = entry.recording->take())
    {
        if (entry.hasFailed)
            continue;
        if (entry.file == nullptr)
        {
            entry.file = std::make_unique<WaveWriter>();
            if (!entry.file->open(entry.recording->getPath(), CallRecording::RATE, 2))
                fail(entry, std::strerror(errno));
        }
        if (entry.file != nullptr && !entry.file->write(*frame))
            fail(entry, std::strerror(errno));
    }
    if (entry.file != nullptr && !entry.file->flush())
        fail(entry, std::strerror(errno));
    if (!isOver)
        return;
    if (entry.recording->getLost() != 0 && !entry.hasFailed)
        fail(entry, "the disk was too slow, there are gaps");
    entry = {};
}

void RecordingWriter::fail(Entry& entry, char const* reason)
{
    entry.hasFailed = true;
    entry.file.reset();
    if (m_failure)
        m_failure(entry.recording->getPath(), reason);
}
