#pragma once

#include "media/rtp/TelephoneEvent.h"

#include <optional>

/// A digit that was keyed in, and for how many milliseconds it was held.
struct HeardDigit
{
    char digit = '\0';
    unsigned int milliseconds = 0;
    bool isSound = false; ///< it was heard in speech, and not told by an event

    friend bool operator==(HeardDigit const&, HeardDigit const&) = default;
};

/// Makes digits of the packets of telephone events: each is told once, at its end; when all three ends were lost, as
/// soon as the next digit begins or nothing has come for a while.
class TelephoneEventReceiver
{
public:
    /// What a packet has brought to an end. `clockRate`: Hz. `now`: nanoseconds.
    std::optional<HeardDigit> receive(RtpHeader const& header, TelephoneEvent const& event, unsigned int clockRate,
                                      long long now);
    /// The digit whose ends were lost, once that is plain.
    std::optional<HeardDigit> expire(long long now);

private:
    std::optional<HeardDigit> take();

    bool m_hasBegun = false;
    bool m_isTold = true; // the newest event
    unsigned char m_event = 0;
    std::uint32_t m_timestamp = 0;
    std::uint32_t m_duration = 0;
    unsigned int m_clockRate = 8000;
    long long m_time = 0; // of the newest packet
};
