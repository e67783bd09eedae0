#include "operation/capture/Capture.h"

#include "media/context/MediaReport.h"
#include "media/rtp/DatagramAddress.h"

#include <spdlog/fmt/fmt.h>

#include <cerrno>
#include <cstring>
#include <new>
#include <stdexcept>
#include <sys/socket.h>
#include <unistd.h>

namespace
{
constexpr unsigned int SENDER_REPORT = 200; // RFC 3550, 12.1
constexpr unsigned int RECEIVER_REPORT = 201;
constexpr int WAITING = 1 << 20; // octets that the system keeps for us

/// As capture servers know the fields of RFC 3550, 6.4.
std::string JSON_OF(RtcpPacket const& packet)
{
    std::string json =
        fmt::format(R"({{"ssrc":{},"type":{})", packet.sender, packet.senderInfo ? SENDER_REPORT : RECEIVER_REPORT);
    if (packet.senderInfo)
        json += fmt::format(R"(,"sender_information":{{"ntp_timestamp_sec":{},"ntp_timestamp_usec":{},)"
                            R"("rtp_timestamp":{},"packets":{},"octets":{}}})",
                            packet.senderInfo->time >> 32, (packet.senderInfo->time & 0xffffffff) * 1000000 >> 32,
                            packet.senderInfo->timestamp, packet.senderInfo->packets, packet.senderInfo->octets);
    json += fmt::format(R"(,"report_count":{},"report_blocks":[)", packet.report ? 1 : 0);
    if (RtcpReport const* const report = packet.report ? &*packet.report : nullptr)
        json += fmt::format(R"({{"source_ssrc":{},"fraction_lost":{},"packets_lost":{},"highest_seq_no":{},)"
                            R"("ia_jitter":{},"lsr":{},"dlsr":{}}})",
                            report->source, report->fractionLost, report->lost, report->highest, report->jitter,
                            report->lastReport, report->delay);
    return json + "]}";
}
} // namespace

Capture::Capture(CaptureOptions const& options) : m_options(options)
{
    DatagramAddress const server(MediaAddress::OF(options.server.host, options.server.port));
    m_socket = socket(server.any.sa_family, SOCK_DGRAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
    if (m_socket >= 0 && connect(m_socket, &server.any, server.length) == 0)
    {
        setsockopt(m_socket, SOL_SOCKET, SO_SNDBUF, &WAITING, sizeof WAITING);
        return;
    }
    std::string const reason = std::strerror(errno);
    if (m_socket >= 0)
        close(m_socket);
    throw std::runtime_error("no way to " + options.server.text() + ": " + reason);
}

Capture::~Capture() { close(m_socket); }

/// A server that is not there is told by the system with the next packet; that one is lost as well.
void Capture::show(HepPacket const& packet)
try
{
    std::string const octets = packet.encode(m_options.id, m_options.password);
    bool const isSent = !octets.empty() && send(m_socket, octets.data(), octets.size(), 0) >= 0;
    ++(isSent ? m_counters.sent : m_counters.lost);
}
catch (std::bad_alloc const&)
{
    noteLost();
}

void Capture::show(MediaReport const& report, std::string const& call)
try
{
    DatagramAddress const from(report.from);
    DatagramAddress const to(report.to);
    std::string const json = JSON_OF(report.packet);
    show(HepPacket{HepPacket::RTCP, IPPROTO_UDP, from.any, to.any, std::chrono::system_clock::now(), json, call});
}
catch (std::bad_alloc const&)
{
    noteLost();
}
