#include "MediaFixture.h"
#include "media/rtp/DatagramAddress.h"

#include <netinet/in.h>
#include <sys/socket.h>

namespace
{
IpAddress const LOOPBACK = MediaAddress::OF("127.0.0.1", 1).host;

int GET(Descriptor const& descriptor, int level, int option)
{
    int value = -1;
    socklen_t length = sizeof value;
    getsockopt(descriptor.get(), level, option, &value, &length);
    return value;
}
} // namespace

TEST(RtpPorts, AreEvenForSpeechAndOddForReports)
{
    RtpPortRange range(12001, 12010, 46);
    RtpPorts ports;
    ASSERT_TRUE(range.open(LOOPBACK, ports).isOk());
    EXPECT_EQ(ports.address.port % 2, 0);
    EXPECT_GE(ports.address.port, 12002);
    EXPECT_EQ(ports.getRtcp().port, ports.address.port + 1);
}

TEST(RtpPorts, RunOutAndComeBack)
{
    RtpPortRange range(12100, 12105, 46);
    std::vector<RtpPorts> taken(3);
    for (RtpPorts& ports : taken)
        EXPECT_TRUE(range.open(LOOPBACK, ports).isOk());
    RtpPorts more;
    EXPECT_EQ(range.open(LOOPBACK, more), XCode::ABSENT);
    taken.pop_back();
    EXPECT_TRUE(range.open(LOOPBACK, more).isOk());
}

TEST(RtpPorts, WhatWasGivenUpRests)
{
    RtpPortRange range(12200, 12207, 46);
    unsigned short first = 0;
    for (unsigned int i = 0; i < 4; ++i)
    {
        RtpPorts ports;
        ASSERT_TRUE(range.open(LOOPBACK, ports).isOk());
        EXPECT_NE(ports.address.port, first);
        first = i == 0 ? ports.address.port : first;
    }
}

TEST(RtpPorts, APairIsPassedOverWhoseOddPortIsTaken)
{
    Descriptor const other(socket(AF_INET, SOCK_DGRAM, 0));
    DatagramAddress const address(MediaAddress{LOOPBACK, 12301});
    ASSERT_EQ(bind(other.get(), &address.any, address.length), 0);
    RtpPortRange range(12300, 12303, 46);
    RtpPorts ports;
    ASSERT_TRUE(range.open(LOOPBACK, ports).isOk());
    EXPECT_EQ(ports.address.port, 12302);
}

TEST(RtpPorts, AForeignAddressIsAFailureAndNotEndlessSearching)
{
    RtpPortRange range(12400, 12499, 46);
    RtpPorts ports;
    EXPECT_EQ(range.open(MediaAddress::OF("192.0.2.1", 1).host, ports), XCode::FAILURE);
}

TEST(RtpPorts, EmptyRangesHaveNone)
{
    for (auto const& [first, last] : {std::pair<unsigned short, unsigned short>{12500, 12500}, {12600, 12500}, {0, 1}})
    {
        RtpPortRange range(first, last, 46);
        RtpPorts ports;
        EXPECT_EQ(range.open(LOOPBACK, ports), XCode::ABSENT) << first << ' ' << last;
    }
}

TEST(RtpPorts, PacketsBearTheCodePoint)
{
    RtpPortRange range(12700, 12799, 46);
    RtpPorts ports;
    ASSERT_TRUE(range.open(LOOPBACK, ports).isOk());
    EXPECT_EQ(GET(ports.rtp, IPPROTO_IP, IP_TOS), 46 << 2);
    EXPECT_EQ(GET(ports.rtcp, IPPROTO_IP, IP_TOS), 46 << 2);
    ASSERT_TRUE(range.open(MediaAddress::OF("::1", 1).host, ports).isOk());
    EXPECT_EQ(GET(ports.rtp, IPPROTO_IPV6, IPV6_TCLASS), 46 << 2);
}

class LegPorts : public MediaFixture
{
};

TEST_F(LegPorts, AreKnownAtOnceAndGivenUpWithTheLeg)
{
    Side side;
    TYPtr<CallMedia> const call = makeCall();
    side.leg = call->addLeg(LOOPBACK, side);
    ASSERT_NE(side.leg, nullptr);
    MediaAddress const address = side.leg->getLocalRtp();
    EXPECT_TRUE(address.isSomewhere());
    EXPECT_EQ(side.leg->getLocalRtcp().port, address.port + 1);
    turn();
    side.leg.reset();
    turn();
    Descriptor const free(socket(AF_INET, SOCK_DGRAM, 0));
    DatagramAddress const wanted(address);
    EXPECT_EQ(bind(free.get(), &wanted.any, wanted.length), 0);
}

TEST_F(LegPorts, AnUnspecifiedOrForeignAddressGetsNoLeg)
{
    Side side;
    TYPtr<CallMedia> const call = makeCall();
    EXPECT_EQ(call->addLeg(IpAddress(), side), nullptr);
    EXPECT_EQ(call->addLeg(MediaAddress::OF("192.0.2.1", 1).host, side), nullptr);
}

TEST_F(LegPorts, NumbersAreNeverUsedAgain)
{
    Side side;
    TYPtr<CallMedia> call = makeCall();
    side.leg = call->addLeg(LOOPBACK, side);
    unsigned long long const leg = side.leg->getNumber();
    unsigned long long const number = call->getNumber();
    side.leg.reset();
    call = makeCall();
    side.leg = call->addLeg(LOOPBACK, side);
    EXPECT_GT(side.leg->getNumber(), leg);
    EXPECT_GT(call->getNumber(), number);
}
