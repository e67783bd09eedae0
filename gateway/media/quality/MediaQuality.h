#pragma once

#include <optional>

/// What is known of a stream so far. What was not measured is absent, which is not the same as 0.
struct MediaQuality
{
    unsigned long long receivedPackets = 0;
    unsigned long long receivedOctets = 0; ///< of payload
    unsigned long long sentPackets = 0;
    unsigned long long sentOctets = 0; ///< of payload
    /// Packets that were expected from the far side and never came, until now; absent: nothing came at all.
    std::optional<unsigned int> lostPackets{};
    std::optional<unsigned int> jitter{};        ///< milliseconds, of what we receive (RFC 3550)
    std::optional<unsigned int> roundTripTime{}; ///< milliseconds; absent: the far side sends no reports
    /// What the far side reports of what it receives from us. @{
    std::optional<unsigned int> farLostPackets{};
    std::optional<unsigned int> farJitter{}; ///< milliseconds
    /// @}
    /// Hundredths, 100 to 450: how what we receive sounds (ITU-T G.107); absent: not measured, or the codec is not
    /// among those with published figures.
    std::optional<unsigned int> meanOpinionScore{};

    /// Packets that were passed over, by reason. @{
    unsigned int malformedPackets = 0; ///< neither RTP nor RTCP as it should be
    unsigned int strayPackets = 0;     ///< from elsewhere, after the far side's address had settled
    unsigned int unknownPackets = 0;   ///< of a payload type that was not agreed
    unsigned int unkeyedPackets = 0;   ///< that SRTP refused
    /// @}

    friend bool operator==(MediaQuality const&, MediaQuality const&) = default;
};
