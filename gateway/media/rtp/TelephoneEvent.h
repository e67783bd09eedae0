#pragma once

#include "media/rtp/RtpPacket.h"

/// The payload of a telephone event (RFC 4733, 2.3).
struct TelephoneEvent
{
    static constexpr std::size_t LENGTH = 4; ///< octets
    static constexpr unsigned char FLASH = 16;

    unsigned char event = 0;
    bool isEnd = false;
    unsigned char volume = 10;  ///< dB below the reference, 0 to 63
    std::uint16_t duration = 0; ///< timestamp units

    /// Whether the octets hold one; of several, as redundant senders pack them, the first.
    bool read(std::span<unsigned char const> payload);
    void write(unsigned char* out) const;

    /// '0' to '9', '*', '#', 'A' to 'D', 'F' for the flash; 0 for an event that is no digit.
    static char DIGIT_OF(unsigned char event);
    /// The reverse, without the flash; 255 for what is no digit.
    static unsigned char EVENT_OF(char digit);
};
