#include "operation/capture/HepCapture.h"

#include "media/context/MediaReport.h"
#include "media/rtp/DatagramAddress.h"
#include "operation/capture/HepPacket.h"
#include "testing/DrivenClock.h"
#include "testing/DrivenLoop.h"

#include <gtest/gtest.h>

#include <array>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <unistd.h>

namespace
{
/// A capture server on a free port.
class HepCaptureTest : public testing::Test
{
protected:
    HepCaptureTest() : m_socket(socket(AF_INET, SOCK_DGRAM | SOCK_NONBLOCK, 0))
    {
        DatagramAddress address(MediaAddress::OF("127.0.0.1", 1));
        address.setPort(0);
        EXPECT_EQ(bind(m_socket, &address.any, address.length), 0);
        getsockname(m_socket, &address.any, &address.length);
        options.server = {"127.0.0.1", address.getPort()};
    }
    ~HepCaptureTest() override { close(m_socket); }

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
    static CapturedMessage message(std::string_view text)
    {
        static DatagramAddress const s_address(MediaAddress::OF("192.0.2.1", 5060));
        return {CapturedMessage::SIP, IPPROTO_UDP, s_address.any, s_address.any, {}, text};
    }

    /// Until those that leave together have left.
    void letPass()
    {
        clock.advance(10);
        loop.turn();
    }

    DrivenClock clock;
    DrivenLoop loop;
    CaptureOptions options;

private:
    int m_socket;
};
} // namespace

TEST_F(HepCaptureTest, MessagesReachTheServerAsTheyAreAndInTheirOrder)
{
    HepCapture capture(options, loop);
    capture.show(message("ACK sip:x SIP/2.0\r\n\r\n"));
    capture.show(message("BYE sip:x SIP/2.0\r\n\r\n"));
    EXPECT_EQ(take(), "");
    letPass();
    EXPECT_TRUE(take().ends_with("ACK sip:x SIP/2.0\r\n\r\n"));
    EXPECT_TRUE(take().ends_with("BYE sip:x SIP/2.0\r\n\r\n"));
    EXPECT_EQ(capture.getCounters().sent, 2u);
    EXPECT_EQ(capture.getCounters().lost, 0u);
    capture.show(message("INVITE"));
    letPass();
    EXPECT_TRUE(take().ends_with("INVITE")) << "the next ones wait anew";
}

TEST_F(HepCaptureTest, ManyDoNotWaitForTheTime)
{
    HepCapture capture(options, loop);
    for (int i = 0; i < 65; ++i)
        capture.show(message(std::to_string(i)));
    EXPECT_EQ(capture.getCounters().sent, 64u);
    letPass();
    EXPECT_EQ(capture.getCounters().sent, 65u);
    for (int i = 0; i < 65; ++i)
        EXPECT_TRUE(take().ends_with(std::to_string(i)));
}

TEST_F(HepCaptureTest, WhatWaitsWhenItEndsIsTold)
{
    {
        HepCapture capture(options, loop);
        capture.show(message("BYE"));
    }
    EXPECT_TRUE(take().ends_with("BYE"));
    EXPECT_FALSE(loop.turn()) << "and no time runs any more";
}

TEST_F(HepCaptureTest, WhatIsLongerThanADatagramIsCounted)
{
    HepCapture capture(options, loop);
    capture.show(message(std::string(HepPacket::LONGEST, 'x')));
    capture.show(message("BYE"));
    letPass();
    EXPECT_TRUE(take().ends_with("BYE"));
    EXPECT_EQ(capture.getCounters().sent, 1u);
    EXPECT_EQ(capture.getCounters().lost, 1u);
}

TEST_F(HepCaptureTest, AServerThatIsNotThereCostsItsPacketsAndNothingElse)
{
    HepCapture capture(options, loop);
    closeServer();
    for (int i = 0; i < 4; ++i)
        capture.show(message("BYE"));
    letPass();
    EXPECT_EQ(capture.getCounters().lost, 2u); // the system tells it with every other packet
    EXPECT_EQ(capture.getCounters().sent, 2u);
}

TEST_F(HepCaptureTest, ASenderReportIsToldWithItsBlockAndTheCallItIsOf)
{
    HepCapture capture(options, loop);
    MediaReport report{{}, MediaAddress::OF("192.0.2.1", 4001), MediaAddress::OF("192.0.2.2", 5001)};
    report.packet.sender = 7;
    report.packet.senderInfo = RtcpSenderInfo{(3900000000ULL << 32) | 0x80000000, 160, 2, 320};
    report.packet.report = RtcpReport{9, 25, 10, 65600, 33, 44, 55};
    capture.show(report, "a@b");
    letPass();
    std::string const octets = take();
    EXPECT_NE(octets.find("a@b"), std::string::npos);
    EXPECT_TRUE(octets.ends_with(
        R"({"ssrc":7,"type":200,"sender_information":{"ntp_timestamp_sec":3900000000,"ntp_timestamp_usec":500000,)"
        R"("rtp_timestamp":160,"packets":2,"octets":320},"report_count":1,"report_blocks":[{"source_ssrc":9,)"
        R"("fraction_lost":25,"packets_lost":10,"highest_seq_no":65600,"ia_jitter":33,"lsr":44,"dlsr":55}]})"));
}

TEST_F(HepCaptureTest, AReportOfWhoDoesNotSendHasNoSenderInformation)
{
    HepCapture capture(options, loop);
    MediaReport const report{{}, MediaAddress::OF("192.0.2.1", 4001), MediaAddress::OF("192.0.2.2", 5001)};
    capture.show(report, "");
    letPass();
    EXPECT_TRUE(take().ends_with(R"({"ssrc":0,"type":201,"report_count":0,"report_blocks":[]})"));
}
