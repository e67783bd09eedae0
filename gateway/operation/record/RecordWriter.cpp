#include "operation/record/RecordWriter.h"

#include "operation/record/CallJson.h"

#include <cerrno>
#include <chrono>
#include <cstring>
#include <fcntl.h>
#include <new>
#include <spdlog/spdlog.h>
#include <stdexcept>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace
{
constexpr std::chrono::milliseconds MOMENT(500); // until a disk that was full is tried again

/// For the owner and the group alone: numbers are nobody else's business.
int OPEN(std::string const& file)
{
    return open(file.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC | O_NOCTTY, 0640);
}
} // namespace

RecordWriter::RecordWriter(RecordOptions const& options) : m_options(options), m_descriptor(OPEN(options.file))
{
    if (m_descriptor < 0)
        throw std::runtime_error(std::string("cannot be opened: ") + std::strerror(errno));
    m_thread = std::thread([this] { run(); });
}

RecordWriter::~RecordWriter()
{
    {
        std::lock_guard const lock(m_mutex);
        m_isEnding = true;
    }
    m_changed.notify_all();
    m_thread.join();
    close(m_descriptor);
    if (unsigned long long const lost = m_counters.lost + m_waiting.size(); lost != 0)
        spdlog::error("{} records of calls are lost: {} takes no more", lost, m_options.file);
}

void RecordWriter::write(CallRecord const& record)
{
    std::lock_guard const lock(m_mutex);
    if (m_waiting.size() >= m_options.kept)
    {
        ++m_counters.lost;
        return;
    }
    m_waiting.push_back(record);
    m_changed.notify_all();
}

void RecordWriter::reopen()
{
    std::lock_guard const lock(m_mutex);
    m_isReopening = true;
    m_changed.notify_all();
}

bool RecordWriter::hasRoom() const
{
    std::lock_guard const lock(m_mutex);
    return m_waiting.size() < m_options.kept;
}

RecordWriter::Counters RecordWriter::getCounters() const
{
    std::lock_guard const lock(m_mutex);
    Counters counters = m_counters;
    counters.waiting = m_waiting.size();
    return counters;
}

void RecordWriter::run()
{
    std::unique_lock lock(m_mutex);
    while (!m_isEnding)
    {
        m_changed.wait(lock, [this] { return m_isEnding || m_isReopening || !m_waiting.empty(); });
        if (std::exchange(m_isReopening, false))
            openAgain();
        writeWaiting(lock);
        if (!m_waiting.empty() && !m_isEnding)
            m_changed.wait_for(lock, MOMENT, [this] { return m_isEnding || m_isReopening; });
    }
    writeWaiting(lock);
}

/// Until one cannot be written. It stays in its place meanwhile, so that it counts as waiting.
void RecordWriter::writeWaiting(std::unique_lock<std::mutex>& lock)
{
    bool isWritten = true;
    while (isWritten && !m_waiting.empty())
    {
        CallRecord const& record = m_waiting.front(); // stays where it is as others come
        lock.unlock();
        try
        {
            isWritten = writeLine(CallJson::LINE_OF(record, m_options.isWhole) + '\n');
        }
        catch (std::bad_alloc const&)
        {
            isWritten = false;
        }
        lock.lock();
        if (!isWritten)
            return;
        m_waiting.pop_front();
        ++m_counters.written;
    }
}

bool RecordWriter::writeLine(std::string const& line) const
{
    struct stat before = {};
    fstat(m_descriptor, &before);
    ssize_t written = 0;
    do
        written = ::write(m_descriptor, line.data(), line.size());
    while (written < 0 && errno == EINTR);
    if (written == static_cast<ssize_t>(line.size()))
        return true;
    if (written > 0 && S_ISREG(before.st_mode) && ftruncate(m_descriptor, before.st_size) != 0)
        spdlog::error("{} ends with a piece of a record", m_options.file);
    return false;
}

void RecordWriter::openAgain()
{
    int const descriptor = OPEN(m_options.file);
    if (descriptor < 0)
    {
        spdlog::error("{} cannot be opened again: records go on where they were", m_options.file);
        return;
    }
    close(std::exchange(m_descriptor, descriptor));
}
