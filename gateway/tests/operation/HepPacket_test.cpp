#include "operation/capture/HepPacket.h"

#include "media/rtp/DatagramAddress.h"

#include <gtest/gtest.h>

namespace
{
using namespace std::chrono_literals;

CapturedMessage PACKET(DatagramAddress const& from, DatagramAddress const& to, std::string_view payload)
{
    return {CapturedMessage::SIP,
            IPPROTO_UDP,
            from.any,
            to.any,
            std::chrono::system_clock::time_point(1790000000s + 123456us),
            payload};
}

std::string ENCODED(CapturedMessage const& message, std::uint32_t agent, std::string_view password = {})
{
    std::string octets = "of the message before";
    HepPacket::ENCODE(octets, message, agent, password);
    return octets;
}

std::string HEX(std::string const& octets)
{
    std::string text;
    for (char const c : octets)
    {
        char buffer[3];
        std::snprintf(buffer, sizeof buffer, "%02x", static_cast<unsigned char>(c));
        text += buffer;
    }
    return text;
}
} // namespace

TEST(HepPacket, HasAChunkForEachOfWhatTheServerWantsToKnow)
{
    DatagramAddress const from(MediaAddress::OF("192.0.2.1", 5060));
    DatagramAddress const to(MediaAddress::OF("192.0.2.10", 5070));
    EXPECT_EQ(HEX(ENCODED(PACKET(from, to, "BYE"), 2001)), "48455033"
                                                           "0066"
                                                           "0000000100"
                                                           "0702"
                                                           "0000000200"
                                                           "0711"
                                                           "00000003000a"
                                                           "c0000201"
                                                           "00000004000a"
                                                           "c000020a"
                                                           "000000070008"
                                                           "13c4"
                                                           "000000080008"
                                                           "13ce"
                                                           "00000009000a"
                                                           "6ab13b80"
                                                           "0000000a000a"
                                                           "0001e240"
                                                           "0000000b0007"
                                                           "01"
                                                           "0000000c000a"
                                                           "000007d1"
                                                           "0000000f0009"
                                                           "425945");
}

TEST(HepPacket, HasAddressesOfVersion6AndTheirFamily)
{
    DatagramAddress const from(MediaAddress::OF("2001:db8::1", 5060));
    DatagramAddress const to(MediaAddress::OF("2001:db8::2", 5060));
    std::string const octets = HEX(ENCODED(PACKET(from, to, "BYE"), 1));
    EXPECT_NE(octets.find("00000001"
                          "0007"
                          "0a"),
              std::string::npos);
    EXPECT_NE(octets.find("00000005"
                          "0016"
                          "20010db8000000000000000000000001"),
              std::string::npos);
    EXPECT_NE(octets.find("00000006"
                          "0016"
                          "20010db8000000000000000000000002"),
              std::string::npos);
}

TEST(HepPacket, SaysWhoItIsAndOfWhichCall)
{
    DatagramAddress const address(MediaAddress::OF("192.0.2.1", 5060));
    CapturedMessage packet = PACKET(address, address, "{}");
    packet.protocol = CapturedMessage::RTCP;
    packet.correlation = "a@b";
    std::string const octets = HEX(ENCODED(packet, 1, "pw"));
    EXPECT_NE(octets.find("0000000b"
                          "0007"
                          "05"),
              std::string::npos);
    EXPECT_NE(octets.find("0000000e"
                          "0008"
                          "7077"),
              std::string::npos);
    EXPECT_NE(octets.find("00000011"
                          "0009"
                          "614062"),
              std::string::npos);
}

TEST(HepPacket, IsAsLongAsADatagramAtMost)
{
    DatagramAddress const address(MediaAddress::OF("192.0.2.1", 5060));
    std::string const small(1, 'x');
    std::size_t const around = ENCODED(PACKET(address, address, small), 1).size() - small.size();
    std::string const most(HepPacket::LONGEST - around, 'x');
    EXPECT_EQ(ENCODED(PACKET(address, address, most), 1).size(), HepPacket::LONGEST);
    EXPECT_EQ(ENCODED(PACKET(address, address, most + 'x'), 1), "");
}
