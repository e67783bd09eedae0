#include "operation/record/RecordWriter.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <chrono>
#include <new>
#include <utility>

namespace
{
constexpr std::chrono::milliseconds MOMENT(500);   // until what was not taken is tried again
constexpr std::chrono::milliseconds GATHERING(20); // for which others may join one that has come
constexpr std::size_t AT_ONCE = 100;
} // namespace

RecordWriter::RecordWriter(std::unique_ptr<RecordTarget> target, unsigned int kept, OnDone onDone)
    : m_target(std::move(target)), m_kept(kept), m_onDone(std::move(onDone))
{
    m_thread = std::thread([this] { run(); });
}

RecordWriter::~RecordWriter() { end(); }

std::size_t RecordWriter::end()
{
    {
        std::lock_guard const lock(m_mutex);
        m_isEnding = true;
    }
    m_changed.notify_all();
    if (m_thread.joinable())
        m_thread.join();
    return m_waiting.size();
}

void RecordWriter::write(std::string line, CallJournal::Ticket ticket)
{
    std::size_t waiting = 0;
    {
        std::lock_guard const lock(m_mutex);
        if (m_waiting.size() < m_kept)
        {
            m_waiting.push_back({std::move(line), ticket});
            waiting = m_waiting.size();
        }
        else
            ++m_lost;
    }
    if (waiting == 0)
        m_onDone(ticket);
    else if (waiting == 1 || waiting == AT_ONCE) // else the thread knows
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
    return m_waiting.size() < m_kept;
}

RecordWriter::Counters RecordWriter::getCounters() const
{
    RecordTarget::Counters const target = m_target->getCounters();
    std::lock_guard const lock(m_mutex);
    return {target.written, m_waiting.size(), target.spooled, m_lost};
}

void RecordWriter::run()
{
    std::unique_lock lock(m_mutex);
    while (true)
    {
        if (std::exchange(m_isReopening, false))
            m_target->reopen();
        bool const isBrought = bring(lock);
        noteStuck(!isBrought);
        bool const isDelivered = deliver(lock); // also what was spooled just now
        if (m_isEnding)
            return;
        if (isDelivered && isBrought)
        {
            m_changed.wait(lock, [this] { return m_isEnding || m_isReopening || !m_waiting.empty(); });
            m_changed.wait_for(lock, GATHERING,
                               [this] { return m_isEnding || m_isReopening || m_waiting.size() >= AT_ONCE; });
        }
        else
            m_changed.wait_for(lock, MOMENT, [this] { return m_isEnding || m_isReopening; });
    }
}

/// Not at the end: it is safe where it is.
bool RecordWriter::deliver(std::unique_lock<std::mutex>& lock)
{
    if (m_isEnding)
        return true;
    lock.unlock();
    bool isDelivered = false;
    try
    {
        isDelivered = m_target->deliver();
    }
    catch (std::bad_alloc const&)
    {
    }
    lock.lock();
    return isDelivered;
}

/// Until one is not taken.
bool RecordWriter::bring(std::unique_lock<std::mutex>& lock)
{
    while (!m_waiting.empty())
        if (!bringSome(lock))
            return false;
    return true;
}

void RecordWriter::noteStuck(bool isStuck)
{
    if (isStuck == std::exchange(m_isStuck, isStuck))
        return;
    if (isStuck)
        spdlog::error("records: the disk takes none, they wait in memory, {} at most", m_kept);
    else
        spdlog::info("records: the disk takes them again");
}

/// They stay in their place meanwhile, so that they count as waiting.
bool RecordWriter::bringSome(std::unique_lock<std::mutex>& lock)
{
    RecordLines lines;
    try
    {
        for (std::size_t i = 0; i < std::min(m_waiting.size(), AT_ONCE); ++i)
            lines.emplace_back(m_waiting[i].line); // which stays where it is as others come
    }
    catch (std::bad_alloc const&)
    {
    }
    lock.unlock();
    std::size_t const taken = take(lines);
    lock.lock();
    for (std::size_t i = 0; i < taken; ++i)
    {
        m_onDone(m_waiting.front().ticket);
        m_waiting.pop_front();
    }
    return taken != 0;
}

std::size_t RecordWriter::take(RecordLines const& lines)
{
    try
    {
        return lines.empty() ? 0 : m_target->take(lines);
    }
    catch (std::bad_alloc const&)
    {
        return 0;
    }
}
