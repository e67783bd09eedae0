#include "media/file/CallRecording.h"

void CallRecording::put(std::span<short const> left, std::span<short const> right)
{
    std::size_t const number = m_put.load(std::memory_order_relaxed);
    if (number - m_taken.load(std::memory_order_acquire) == MOST_WAITING)
    {
        m_lost.fetch_add(1, std::memory_order_relaxed);
        return;
    }
    Frame& frame = m_frames[number % MOST_WAITING];
    for (std::size_t i = 0; i < FRAME; ++i)
    {
        frame[2 * i] = left[i];
        frame[2 * i + 1] = right[i];
    }
    m_put.store(number + 1, std::memory_order_release);
}

CallRecording::Frame const* CallRecording::take()
{
    m_taken.store(m_given, std::memory_order_release);
    if (m_given == m_put.load(std::memory_order_acquire))
        return nullptr;
    return &m_frames[m_given++ % MOST_WAITING];
}
