// Reads any octets as what comes from the network: RTP, RTCP and telephone events, and what is counted of them. The
// first octet says where they go.
#include "media/rtp/RtcpReports.h"
#include "media/rtp/TelephoneEventReceiver.h"

#include <cstdlib>
#include <vector>

namespace
{
constexpr long long SECOND = 1000000000;

void READ_RTP(std::span<unsigned char> octets)
{
    static RtpReception s_reception;
    static RtpNumbering s_numbering(1, 2, 3);
    static TelephoneEventReceiver s_receiver;
    static long long s_now = 0;
    RtpPacket packet;
    if (!packet.read(octets))
        return;
    if (packet.payload.data() < octets.data() + RtpHeader::LENGTH ||
        packet.payload.data() + packet.payload.size() > octets.data() + octets.size())
        std::abort();
    s_now += SECOND / 50;
    s_reception.count(packet.header, 8000, s_now);
    s_reception.takeFractionLost();
    s_numbering.relay(packet.header, 8, 8000, 1, s_now);
    TelephoneEvent event;
    if (event.read(packet.payload))
        s_receiver.receive(packet.header, event, 8000, s_now);
}

void READ_RTCP(std::span<unsigned char> octets)
{
    static RtcpReports s_reports(5 * SECOND, 1);
    static RtpReception s_reception;
    static MediaQuality s_quality;
    RtcpPacket packet;
    if (!packet.read(octets, octets.size() >= 12 ? READ_32(&octets[8]) : 0))
        return;
    s_reports.take(packet, s_reception, 8000, s_quality, 100 * SECOND);
    // what we write of it reads back the same
    std::array<unsigned char, RtcpPacket::LONGEST> written;
    std::size_t const length = packet.write(written, 1);
    RtcpPacket again;
    if (!again.read(std::span(written).first(length), packet.report ? packet.report->source : 0) ||
        again.report.has_value() != packet.report.has_value() || again.isBye != packet.isBye)
        std::abort();
}
} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* octets, std::size_t size)
{
    if (size == 0)
        return -1;
    std::vector<unsigned char> copy(octets + 1, octets + size); // as long as it is, so that each step beyond shows
    if (octets[0] % 2 == 0)
        READ_RTP(copy);
    else
        READ_RTCP(copy);
    return 0;
}
