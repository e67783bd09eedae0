#pragma once

#include "media/rtp/TelephoneEvent.h"

#include <array>
#include <optional>

/// Digits on their way out as telephone events: of each a packet every 20 ms with the timestamp of its start, three
/// with the end, and 60 ms of silence before the next (RFC 4733, 2.5.1).
///
///     if (sender.isBusy())
///         if (std::optional<TelephoneEventSender::Packet> const packet = sender.tick(clockRate))
///             ... // goes out
class TelephoneEventSender
{
public:
    struct Packet
    {
        TelephoneEvent event;
        bool isFirst = false; ///< bears the marker and begins the timestamp
    };
    static constexpr unsigned int TICK = 20; ///< milliseconds

    /// Whether it is one and there was room for it. `milliseconds`: brought to 40 to 5000.
    bool add(char digit, unsigned int milliseconds);
    bool isBusy() const { return m_size != 0; }
    /// What the next 20 ms send; nothing in the silence between digits.
    std::optional<Packet> tick(unsigned int clockRate);
    void clear() { m_size = m_ticks = 0; }

private:
    static constexpr std::size_t ROOM = 32;
    static constexpr unsigned int ENDS = 3;
    static constexpr unsigned int SILENCE = 3; // ticks

    struct Waiting
    {
        unsigned char event;
        unsigned short ticks; // that it lasts
    };
    std::array<Waiting, ROOM> m_waiting{};
    std::size_t m_first = 0;
    std::size_t m_size = 0;
    unsigned int m_ticks = 0; // of the first one's, that have gone by
};
