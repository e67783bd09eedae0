#include "media/rtp/RtpPacket.h"

namespace
{
constexpr unsigned int VERSION = 2;

/// The octets of the header with its contributing sources and its extension; 0: they are not all there.
std::size_t HEADER_LENGTH(std::span<unsigned char const> octets)
{
    std::size_t length = RtpHeader::LENGTH + 4u * (octets[0] & 0x0fu);
    if ((octets[0] & 0x10) == 0)
        return length <= octets.size() ? length : 0;
    if (length + 4 > octets.size())
        return 0;
    length += 4 + 4u * READ_16(&octets[length + 2]);
    return length <= octets.size() ? length : 0;
}
} // namespace

void RtpHeader::write(unsigned char* out) const
{
    out[0] = VERSION << 6;
    out[1] = static_cast<unsigned char>((marker ? 0x80 : 0) | type);
    WRITE_16(out + 2, sequence);
    WRITE_32(out + 4, timestamp);
    WRITE_32(out + 8, source);
}

bool RtpPacket::read(std::span<unsigned char> octets)
{
    if (octets.size() < RtpHeader::LENGTH || octets[0] >> 6 != VERSION)
        return false;
    std::size_t const length = HEADER_LENGTH(octets);
    if (length == 0)
        return false;
    std::size_t const padding = (octets[0] & 0x20) == 0 ? 0 : octets.back();
    if (((octets[0] & 0x20) != 0 && padding == 0) || padding > octets.size() - length)
        return false;
    header.marker = (octets[1] & 0x80) != 0;
    header.type = octets[1] & 0x7f;
    header.sequence = READ_16(&octets[2]);
    header.timestamp = READ_32(&octets[4]);
    header.source = READ_32(&octets[8]);
    payload = octets.subspan(length, octets.size() - length - padding);
    return true;
}
