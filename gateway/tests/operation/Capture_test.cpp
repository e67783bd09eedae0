#include "operation/capture/Capture.h"

#include "media/context/MediaReport.h"
#include "media/rtp/DatagramAddress.h"

#include <gtest/gtest.h>

#include <array>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <unistd.h>

namespace
{
/// A capture server on a free port.
class CaptureTest : public testing::Test
{
protected:
    CaptureTest() : m_socket(socket(AF_INET, SOCK_DGRAM | SOCK_NONBLOCK, 0))
    {
        DatagramAddress address(MediaAddress::OF("127.0.0.1", 1));
        address.setPort(0);
        EXPECT_EQ(bind(m_socket, &address.any, address.length), 0);
        getsockname(m_socket, &address.any, &address.length);
        options.server = {"127.0.0.1", address.getPort()};
    }
    ~CaptureTest() override { close(m_socket); }

    /// Empty: nothing has come.
    std::string take() const
    {
        std::array<char, HepPacket::LONGEST> octets;
        ssize_t const length = recv(m_socket, octets.data(), octets.size(), 0);
        return length > 0 ? std::string(octets.data(), static_cast<std::size_t>(length)) : "";
    }
    void closeServer()
    {
        close(m_socket);
        m_socket = -1;
    }
    static HepPacket message(std::string_view text)
    {
        static DatagramAddress const s_address(MediaAddress::OF("192.0.2.1", 5060));
        return {HepPacket::SIP, IPPROTO_UDP, s_address.any, s_address.any, {}, text};
    }

    CaptureOptions options;

private:
    int m_socket;
};
} // namespace

TEST_F(CaptureTest, AMessageReachesTheServerAsItIs)
{
    Capture capture(options);
    capture.show(message("BYE sip:x SIP/2.0\r\n\r\n"));
    EXPECT_TRUE(take().ends_with("BYE sip:x SIP/2.0\r\n\r\n"));
    EXPECT_EQ(capture.getCounters().sent, 1u);
    EXPECT_EQ(capture.getCounters().lost, 0u);
}

TEST_F(CaptureTest, WhatIsLongerThanADatagramIsCounted)
{
    Capture capture(options);
    capture.show(message(std::string(HepPacket::LONGEST, 'x')));
    EXPECT_EQ(take(), "");
    EXPECT_EQ(capture.getCounters().lost, 1u);
}

TEST_F(CaptureTest, AServerThatIsNotThereCostsItsPacketsAndNothingElse)
{
    Capture capture(options);
    closeServer();
    for (int i = 0; i < 4; ++i)
        capture.show(message("BYE"));
    EXPECT_EQ(capture.getCounters().lost, 2u); // the system tells it with every other packet
    EXPECT_EQ(capture.getCounters().sent, 2u);
}

TEST_F(CaptureTest, ASenderReportIsToldWithItsBlockAndTheCallItIsOf)
{
    Capture capture(options);
    MediaReport report{{}, MediaAddress::OF("192.0.2.1", 4001), MediaAddress::OF("192.0.2.2", 5001)};
    report.packet.sender = 7;
    report.packet.senderInfo = RtcpSenderInfo{(3900000000ULL << 32) | 0x80000000, 160, 2, 320};
    report.packet.report = RtcpReport{9, 25, 10, 65600, 33, 44, 55};
    capture.show(report, "a@b");
    std::string const octets = take();
    EXPECT_NE(octets.find("a@b"), std::string::npos);
    EXPECT_TRUE(octets.ends_with(
        R"({"ssrc":7,"type":200,"sender_information":{"ntp_timestamp_sec":3900000000,"ntp_timestamp_usec":500000,)"
        R"("rtp_timestamp":160,"packets":2,"octets":320},"report_count":1,"report_blocks":[{"source_ssrc":9,)"
        R"("fraction_lost":25,"packets_lost":10,"highest_seq_no":65600,"ia_jitter":33,"lsr":44,"dlsr":55}]})"));
}

TEST_F(CaptureTest, AReportOfWhoDoesNotSendHasNoSenderInformation)
{
    Capture capture(options);
    MediaReport const report{{}, MediaAddress::OF("192.0.2.1", 4001), MediaAddress::OF("192.0.2.2", 5001)};
    capture.show(report, "");
    EXPECT_TRUE(take().ends_with(R"({"ssrc":0,"type":201,"report_count":0,"report_blocks":[]})"));
}
