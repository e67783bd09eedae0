#pragma once

#include "media/quality/MediaQuality.h"

#include <array>
#include <atomic>
#include <cstdint>
#include <cstring>
#include <type_traits>

/// What is known of a stream, written by the datapath and read by signalling at any time, neither of whom waits for the
/// other: a reader that meets a writer reads again.
class QualityCell
{
public:
    /// By one thread.
    void write(MediaQuality const& quality)
    {
        std::array<std::uint64_t, WORDS> words{};
        std::memcpy(words.data(), &quality, sizeof quality);
        unsigned int const turn = m_turn.load(std::memory_order_relaxed);
        m_turn.store(turn + 1, std::memory_order_relaxed);
        for (std::size_t i = 0; i < WORDS; ++i)
            m_words[i].store(words[i], std::memory_order_release);
        m_turn.store(turn + 2, std::memory_order_release);
    }
    /// By any. All 0 and absent before the first.
    MediaQuality read() const
    {
        std::array<std::uint64_t, WORDS> words{};
        unsigned int before = 0;
        do
        {
            before = m_turn.load(std::memory_order_acquire);
            for (std::size_t i = 0; i < WORDS; ++i)
                words[i] = m_words[i].load(std::memory_order_acquire);
        } while (before % 2 != 0 || before != m_turn.load(std::memory_order_relaxed));
        MediaQuality quality;
        if (before != 0)
            std::memcpy(static_cast<void*>(&quality), words.data(), sizeof quality);
        return quality;
    }

private:
    static_assert(std::is_trivially_copyable_v<MediaQuality>);
    static constexpr std::size_t WORDS = (sizeof(MediaQuality) + 7) / 8;

    std::atomic<unsigned int> m_turn{0}; // odd: it is being written
    std::array<std::atomic<std::uint64_t>, WORDS> m_words{};
};
