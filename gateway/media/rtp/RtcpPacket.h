#pragma once

#include "media/rtp/RtpPacket.h"

#include <optional>

/// What one side of a stream reports of what it receives (RFC 3550, 6.4.1).
struct RtcpReport
{
    std::uint32_t source = 0; ///< of whom it tells
    unsigned char fractionLost = 0;
    int lost = 0; ///< -8388608 to 8388607
    std::uint32_t highest = 0;
    std::uint32_t jitter = 0;
    std::uint32_t lastReport = 0; ///< the middle of the time of the sender report that came last; 0: none came
    std::uint32_t delay = 0;      ///< since that came, in 65536ths of a second
};

/// What one side says of what it sends.
struct RtcpSenderInfo
{
    unsigned long long time = 0; ///< NTP: seconds and fraction
    std::uint32_t timestamp = 0;
    std::uint32_t packets = 0;
    std::uint32_t octets = 0;
};

/// A compound packet, as much of it as a gateway acts upon: SR, RR and BYE; SDES, APP and what is unknown are passed
/// over.
struct RtcpPacket
{
    std::uint32_t sender = 0;
    std::optional<RtcpSenderInfo> senderInfo;
    std::optional<RtcpReport> report; ///< the one of `about`
    bool isBye = false;

    /// Whether the octets are a compound packet as RFC 3550, A.2 wants it: version 2, a report first, lengths that add
    /// up. Of several reports the one about the source `about` is taken. Reduced-size packets (RFC 5506), which begin
    /// with something else, are taken, too.
    bool read(std::span<unsigned char const> octets, std::uint32_t about);

    static constexpr std::size_t LONGEST = 128; ///< octets that `write` needs
    /// Writes a compound packet: SR with sender info, else RR; SDES with a canonical name made of `name`; BYE if
    /// `isBye`. The number of octets.
    std::size_t write(std::span<unsigned char, LONGEST> out, unsigned long long name) const;

private:
    bool readOne(std::span<unsigned char const> packet, std::uint32_t about);
    void readReports(std::span<unsigned char const> blocks, unsigned int count, std::uint32_t about);
};
