#include "media/rtp/RtcpPacket.h"

#include <algorithm>
#include <cstdio>
#include <cstring>

namespace
{
enum PacketType : unsigned char
{
    FIRST_TYPE = 192, // what lies outside of these two is no RTCP (RFC 5761, 4)
    SENDER_REPORT = 200,
    RECEIVER_REPORT = 201,
    SOURCE_DESCRIPTION = 202,
    BYE = 203,
    LAST_TYPE = 223
};
constexpr std::size_t HEADER = 4;
constexpr std::size_t SENDER_INFO = 20;
constexpr std::size_t REPORT = 24;
constexpr unsigned char CNAME = 1;

RtcpReport READ_REPORT(unsigned char const* from)
{
    // 24 bits signed
    int const lost = static_cast<int>(READ_32(from + 4) << 8) >> 8;
    return {READ_32(from),      from[4],           lost, READ_32(from + 8), READ_32(from + 12),
            READ_32(from + 16), READ_32(from + 20)};
}

void WRITE_REPORT(unsigned char* to, RtcpReport const& report)
{
    WRITE_32(to, report.source);
    WRITE_32(to + 4, (static_cast<std::uint32_t>(std::clamp(report.lost, -0x800000, 0x7fffff)) & 0xffffffu) |
                         static_cast<std::uint32_t>(report.fractionLost) << 24);
    WRITE_32(to + 8, report.highest);
    WRITE_32(to + 12, report.jitter);
    WRITE_32(to + 16, report.lastReport);
    WRITE_32(to + 20, report.delay);
}

void WRITE_HEADER(unsigned char* to, unsigned int count, PacketType type, std::size_t length)
{
    to[0] = static_cast<unsigned char>(0x80 | count);
    to[1] = type;
    WRITE_16(to + 2, static_cast<std::uint16_t>(length / 4 - 1));
}

std::size_t WRITE_BYE(unsigned char* to, std::uint32_t sender)
{
    WRITE_HEADER(to, 1, BYE, HEADER + 4);
    WRITE_32(to + HEADER, sender);
    return HEADER + 4;
}

/// The canonical name tells nothing of this machine (RFC 7022).
std::size_t WRITE_NAME(unsigned char* to, std::uint32_t sender, unsigned long long name)
{
    char text[20];
    auto const length = static_cast<std::size_t>(std::snprintf(text, sizeof text, "%016llx", name));
    std::size_t const whole = (HEADER + 4 + 2 + length + 1 + 3) / 4 * 4; // ends with at least one octet 0
    std::memset(to, 0, whole);
    WRITE_HEADER(to, 1, SOURCE_DESCRIPTION, whole);
    WRITE_32(to + HEADER, sender);
    to[HEADER + 4] = CNAME;
    to[HEADER + 5] = static_cast<unsigned char>(length);
    std::memcpy(to + HEADER + 6, text, length);
    return whole;
}
} // namespace

void RtcpPacket::readReports(std::span<unsigned char const> blocks, unsigned int count, std::uint32_t about)
{
    for (; count > 0 && blocks.size() >= REPORT; --count, blocks = blocks.subspan(REPORT))
    {
        if (READ_32(blocks.data()) == about)
            report = READ_REPORT(blocks.data());
    }
}

bool RtcpPacket::readOne(std::span<unsigned char const> packet, std::uint32_t about)
{
    unsigned int const count = packet[0] & 0x1f;
    std::span<unsigned char const> body = packet.subspan(HEADER);
    if (packet[1] == BYE)
    {
        isBye = true;
        if (count != 0 && body.size() >= 4)
            sender = READ_32(body.data());
        return count * 4u <= body.size();
    }
    if (packet[1] != SENDER_REPORT && packet[1] != RECEIVER_REPORT)
        return true;
    std::size_t const fixed = packet[1] == SENDER_REPORT ? 4 + SENDER_INFO : 4;
    if (body.size() < fixed + count * REPORT)
        return false;
    sender = READ_32(body.data());
    if (packet[1] == SENDER_REPORT)
        senderInfo = RtcpSenderInfo{static_cast<unsigned long long>(READ_32(&body[4])) << 32 | READ_32(&body[8]),
                                    READ_32(&body[12]), READ_32(&body[16]), READ_32(&body[20])};
    readReports(body.subspan(fixed), count, about);
    return true;
}

bool RtcpPacket::read(std::span<unsigned char const> octets, std::uint32_t about)
{
    *this = RtcpPacket();
    if (octets.size() < HEADER + 4)
        return false;
    while (!octets.empty())
    {
        if (octets.size() < HEADER || octets[0] >> 6 != 2 || octets[1] < FIRST_TYPE || octets[1] > LAST_TYPE)
            return false;
        std::size_t const length = 4u * (READ_16(&octets[2]) + 1u);
        bool const isPadded = (octets[0] & 0x20) != 0;
        if (length > octets.size() || (isPadded && length != octets.size()))
            return false;
        std::size_t const padding = isPadded ? octets[length - 1] : 0;
        if (padding > length - HEADER || !readOne(octets.first(length - padding), about))
            return false;
        octets = octets.subspan(length);
    }
    return true;
}

std::size_t RtcpPacket::write(std::span<unsigned char, LONGEST> out, unsigned long long name) const
{
    unsigned char* to = out.data();
    std::size_t length = HEADER + 4 + (senderInfo ? SENDER_INFO : 0);
    WRITE_32(to + HEADER, sender);
    if (senderInfo)
    {
        WRITE_32(to + 8, static_cast<std::uint32_t>(senderInfo->time >> 32));
        WRITE_32(to + 12, static_cast<std::uint32_t>(senderInfo->time));
        WRITE_32(to + 16, senderInfo->timestamp);
        WRITE_32(to + 20, senderInfo->packets);
        WRITE_32(to + 24, senderInfo->octets);
    }
    if (report)
    {
        WRITE_REPORT(to + length, *report);
        length += REPORT;
    }
    WRITE_HEADER(to, report ? 1 : 0, senderInfo ? SENDER_REPORT : RECEIVER_REPORT, length);
    length += WRITE_NAME(to + length, sender, name);
    return isBye ? length + WRITE_BYE(to + length, sender) : length;
}
