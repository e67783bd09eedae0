#include "operation/capture/HepCapture.h"

#include "media/context/MediaReport.h"
#include "media/rtp/DatagramAddress.h"
#include "operation/capture/HepPacket.h"

#include <spdlog/fmt/fmt.h>

#include <algorithm>
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
constexpr int WAITING = 1 << 20;      // octets that the system keeps for us
constexpr unsigned int TOGETHER = 10; // milliseconds after the first of those that leave together

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

HepCapture::HepCapture(CaptureOptions const& options, TYEventLoop& loop)
    : m_options(options), m_timer(loop, EventPrio::LOW, ON_TIME, this)
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

HepCapture::~HepCapture()
{
    send();
    close(m_socket);
}

void HepCapture::ON_TIME(void* self) { static_cast<HepCapture*>(self)->send(); }

void HepCapture::show(CapturedMessage const& message)
try
{
    std::string& octets = m_packets[m_waiting];
    HepPacket::ENCODE(octets, message, m_options.id, m_options.password);
    if (octets.empty())
        return noteLost();
    if (++m_waiting == MOST_WAITING)
        send();
    else if (m_waiting == 1)
        m_timer.start(TOGETHER);
}
catch (std::bad_alloc const&)
{
    noteLost();
}

/// A server that is not there is told by the system with the next packet; that one is lost as well.
void HepCapture::send()
{
    m_timer.stop();
    std::array<iovec, MOST_WAITING> places;
    std::array<mmsghdr, MOST_WAITING> messages{};
    for (std::size_t i = 0; i < m_waiting; ++i)
    {
        places[i] = {m_packets[i].data(), m_packets[i].size()};
        messages[i].msg_hdr.msg_iov = &places[i];
        messages[i].msg_hdr.msg_iovlen = 1;
    }
    for (std::size_t next = 0; next < m_waiting; ++next) // behind the one that is lost
    {
        int const sent = sendmmsg(m_socket, &messages[next], static_cast<unsigned int>(m_waiting - next), 0);
        next += static_cast<std::size_t>(std::max(sent, 0));
        m_counters.sent += static_cast<unsigned long long>(std::max(sent, 0));
        if (next < m_waiting)
            noteLost();
    }
    m_waiting = 0;
}

void HepCapture::show(MediaReport const& report, std::string const& call)
try
{
    DatagramAddress const from(report.from);
    DatagramAddress const to(report.to);
    std::string const json = JSON_OF(report.packet);
    show(CapturedMessage{CapturedMessage::RTCP, IPPROTO_UDP, from.any, to.any, std::chrono::system_clock::now(), json,
                         call});
}
catch (std::bad_alloc const&)
{
    noteLost();
}
