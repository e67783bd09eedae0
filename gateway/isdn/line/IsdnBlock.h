#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

/// What goes over a B channel: 20 ms of A-law (G.711), and when they were spoken. On the wire 4 octets of timestamp,
/// the most significant first, then 160 of speech.
///
///     IsdnBlock block;
///     while (block.receive(descriptor))
///         ...
///     block.timestamp += IsdnBlock::SAMPLES;
///     block.send(descriptor);
struct IsdnBlock
{
    static constexpr std::size_t SAMPLES = 160; ///< of 125 us, an octet each
    static constexpr std::size_t LENGTH = 4 + SAMPLES;
    static constexpr unsigned char SILENCE = 0xd5; ///< a sample of level 0

    std::uint32_t timestamp = 0; ///< in samples; of the sender, and wrapping
    std::array<unsigned char, SAMPLES> speech{};

    /// The next block that waits at a B channel: whether there was one. What is none is passed over.
    bool receive(int channel);
    /// Whether the channel took it; it is lost otherwise.
    bool send(int channel) const;
};
