#pragma once

#include <array>
#include <atomic>
#include <span>
#include <string>
#include <vector>

/// What is said in one call on its way from the datapath to a file: frames of 20 ms in two channels, left what the
/// caller says, right what all others say. One thread puts and another one takes, without a lock.
class CallRecording
{
public:
    static constexpr unsigned int RATE = 8000; ///< Hz; what lies higher is not kept
    static constexpr std::size_t FRAME = RATE / 50;
    static constexpr std::size_t MOST_WAITING = 150; ///< frames: three seconds in which nobody takes
    using Frame = std::array<short, 2 * FRAME>;      ///< left and right in turn

    /// Throws std::bad_alloc.
    explicit CallRecording(std::string const& path) : m_path(path), m_frames(MOST_WAITING) {}

    /// Where it goes.
    std::string const& getPath() const { return m_path; }

    /// REQUIRES: each is as long as FRAME. What there is no room for is lost, and counted.
    void put(std::span<short const> left, std::span<short const> right);
    bool hasBegun() const { return m_put.load(std::memory_order_relaxed) != 0; }
    /// The oldest frame that waits; null: none. It is there until the next call.
    Frame const* take();
    unsigned int getLost() const { return m_lost.load(std::memory_order_relaxed); }

    /// Nothing more will be put; from any thread.
    void end() { m_isOver.store(true, std::memory_order_release); }
    bool isOver() const { return m_isOver.load(std::memory_order_acquire); }

private:
    std::string m_path;
    std::vector<Frame> m_frames;
    std::atomic<std::size_t> m_put{0};
    std::atomic<std::size_t> m_taken{0};
    std::size_t m_given = 0; // by take: what lies before may be put anew
    std::atomic<unsigned int> m_lost{0};
    std::atomic<bool> m_isOver{false};
};
