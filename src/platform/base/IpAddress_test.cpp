#include "platform/base/IpAddress.h"

#include <gtest/gtest.h>
#include <string>

namespace
{
enum class Kind
{
    HOST,
    NET,
    NEITHER
};

struct Accepted
{
    char const* text;
    char const* printed;
    Kind kind;
    unsigned int version;
    unsigned int prefixLength;
};
constexpr Accepted s_accepted[] = {
    {"0.0.0.0", "0.0.0.0", Kind::NEITHER, 4, 32},
    {"::", "::", Kind::NEITHER, 6, 128},
    {"0:0:0:0:0:0:0:0", "::", Kind::NEITHER, 6, 128},
    {"::0.0.0.0", "::", Kind::NEITHER, 6, 128},
    {"192.0.2.1", "192.0.2.1", Kind::HOST, 4, 32},
    {"0.0.0.1", "0.0.0.1", Kind::HOST, 4, 32},
    {"255.255.255.255", "255.255.255.255", Kind::HOST, 4, 32},
    {"127.0.0.1", "127.0.0.1", Kind::HOST, 4, 32},
    {"::1", "::1", Kind::HOST, 6, 128},
    {"2001:DB8::00A", "2001:db8::a", Kind::HOST, 6, 128},
    {"2001:0db8:0000:0000:0001:0000:0000:0001", "2001:db8::1:0:0:1", Kind::HOST, 6, 128},
    {"1:2:3:4:5:6:0:8", "1:2:3:4:5:6:0:8", Kind::HOST, 6, 128},
    {"1:2:3:4:5:6:7::", "1:2:3:4:5:6:7:0", Kind::HOST, 6, 128},
    {"::ffff:192.0.2.1", "::ffff:192.0.2.1", Kind::HOST, 6, 128},
    {"ffff:ffff:ffff:ffff:ffff:ffff:255.255.255.255", "ffff:ffff:ffff:ffff:ffff:ffff:ffff:ffff", Kind::HOST, 6, 128},
    {"10.0.0.0/8", "10.0.0.0/8", Kind::NET, 4, 8},
    {"0.0.0.0/0", "0.0.0.0/0", Kind::NET, 4, 0},
    {"0.0.0.0/8", "0.0.0.0/8", Kind::NET, 4, 8},
    {"10.128.0.0/9", "10.128.0.0/9", Kind::NET, 4, 9},
    {"192.0.2.254/31", "192.0.2.254/31", Kind::NET, 4, 31},
    {"192.0.2.1/32", "192.0.2.1/32", Kind::NET, 4, 32},
    {"2001:db8::/32", "2001:db8::/32", Kind::NET, 6, 32},
    {"::/0", "::/0", Kind::NET, 6, 0},
    {"2001:DB8::8000:0:0:0/65", "2001:db8:0:0:8000::/65", Kind::NET, 6, 65},
    {"::1/128", "::1/128", Kind::NET, 6, 128},
};

constexpr char const* s_refused[] = {
    "",
    " ",
    "/",
    "/8",
    "x",
    "localhost",
    // version 4
    "1",
    "1.2",
    "1.2.3",
    "1.2.3.4.5",
    "1.2.3.",
    ".1.2.3",
    "1..2.3",
    "1.2.3.4.",
    "256.0.0.1",
    "1.2.3.256",
    "1.2.3.1000",
    "01.2.3.4",
    "1.2.3.04",
    "1.2.3.00",
    "0x1.2.3.4",
    "-1.2.3.4",
    "+1.2.3.4",
    "1.2.3.-4",
    "1,2,3,4",
    "1.2.3.a",
    "3232235777",
    // version 6
    ":",
    ":::",
    "1::2::3",
    "1:2:3:4:5:6:7",
    "1:2:3:4:5:6:7:8:9",
    "1:2:3:4:5:6:7:8::",
    "12345::",
    "g::1",
    ":1::",
    "1::2:",
    "::00001",
    "1:2:3:4:5:6:7:1.2.3.4",
    "::1.2.3",
    "::01.2.3.4",
    "::1.2.3.256",
    "[::1]",
    "-1::",
    "::ffff:1.2.3.4.5",
    "0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0:0",
    // blanks and what stands around an address
    " 1.2.3.4",
    "1.2.3.4 ",
    "1.2.3.4\n",
    "\t::1",
    "::1 ",
    "1.2.3 .4",
    "1.2.3.4x",
    "1.2.3.4:5060",
    "sip:1.2.3.4",
    // zones
    "fe80::1%eth0",
    "fe80::1%1",
    "fe80::%1/64",
    "1.2.3.4%lo",
    // prefixes
    "10.0.0.0/",
    "10.0.0.0/33",
    "10.0.0.0/-1",
    "10.0.0.0/+8",
    "10.0.0.0/08",
    "10.0.0.0/00",
    "10.0.0.0/ 8",
    "10.0.0.0/8 ",
    "10.0.0.0 /8",
    "10.0.0.0/8x",
    "10.0.0.0/8/8",
    "10.0.0.0//8",
    "10.0.0.0/0x8",
    "10.0.0.0/255.0.0.0",
    "10.0.0.0/4294967304",
    "10.0.0.0/99999999999999999999",
    "2001:db8::/129",
    "2001:db8::/032",
    "::/",
    // bits behind the prefix
    "10.0.0.1/8",
    "10.0.0.1/31",
    "192.0.2.1/0",
    "10.128.0.0/8",
    "2001:db8::1/32",
    "2001:db8::/28",
    "::1/127",
    "::1/0",
};

Kind KIND_OF(IpAddress const& address)
{
    EXPECT_FALSE(address.isHostType() && address.isNetType());
    return address.isHostType() ? Kind::HOST : address.isNetType() ? Kind::NET : Kind::NEITHER;
}

IpAddress ADDRESS(char const* text)
{
    IpAddress address;
    EXPECT_TRUE(address.setIpAddrAsString(text).isOk()) << text;
    return address;
}

std::string PRINTED(IpAddress const& address)
{
    String text("replaced");
    EXPECT_EQ(&text, &address.getIpAddrAsString(text));
    return text.c_str();
}
} // namespace

TEST(IpAddress, AnAddressIsReadAndPrintedInItsCanonicalForm)
{
    for (Accepted const& row : s_accepted)
    {
        IpAddress const address = ADDRESS(row.text);
        EXPECT_EQ(row.printed, PRINTED(address)) << row.text;
        EXPECT_EQ(row.kind, KIND_OF(address)) << row.text;
        EXPECT_EQ(row.version, address.getVersion()) << row.text;
        EXPECT_EQ(row.prefixLength, address.getPrefixLength()) << row.text;
        EXPECT_EQ(address, ADDRESS(row.printed)) << row.text;
    }
}

TEST(IpAddress, EverythingElseIsRefusedAndLeavesTheValueUnchanged)
{
    for (char const* const before : {"192.0.2.1", "2001:db8::/32"})
        for (char const* const text : s_refused)
        {
            IpAddress address = ADDRESS(before);
            EXPECT_EQ(XCode::FAILURE, address.setIpAddrAsString(text)) << "'" << text << "'";
            EXPECT_EQ(ADDRESS(before), address) << "'" << text << "'";
        }
}

TEST(IpAddress, ANulByteIsNoEndOfTheText)
{
    IpAddress address;
    EXPECT_EQ(XCode::FAILURE, address.setIpAddrAsString(String("1.2.3.4\0", 8)));
    EXPECT_EQ(XCode::FAILURE, address.setIpAddrAsString(String("1.2.3.4\0/8", 10)));
    EXPECT_EQ(XCode::FAILURE, address.setIpAddrAsString(String("10.0.0.0/8\0", 11)));
    EXPECT_EQ(IpAddress(), address);
}

TEST(IpAddress, ADefaultAddressIsTheUnspecifiedOneOfVersionFour)
{
    IpAddress const address;
    EXPECT_EQ("0.0.0.0", PRINTED(address));
    EXPECT_EQ(Kind::NEITHER, KIND_OF(address));
    EXPECT_EQ(ADDRESS("0.0.0.0"), address);
}

TEST(IpAddress, VersionAndKindMakeADifferenceSpellingDoesNot)
{
    EXPECT_EQ(ADDRESS("2001:db8::1"), ADDRESS("2001:0DB8:0::0:1"));
    EXPECT_FALSE(ADDRESS("0.0.0.0") == ADDRESS("::"));
    EXPECT_FALSE(ADDRESS("192.0.2.1") == ADDRESS("::ffff:192.0.2.1"));
    EXPECT_FALSE(ADDRESS("192.0.2.1") == ADDRESS("192.0.2.1/32"));
    EXPECT_FALSE(ADDRESS("10.0.0.0/8") == ADDRESS("10.0.0.0/9"));
    EXPECT_FALSE(ADDRESS("0.0.0.0") == ADDRESS("0.0.0.0/0"));
}

TEST(IpAddress, AVersionFourAddressReplacesAVersionSixOneWholly)
{
    IpAddress address = ADDRESS("2001:db8::/32");
    ASSERT_TRUE(address.setIpAddrAsString("192.0.2.1").isOk());
    EXPECT_EQ(ADDRESS("192.0.2.1"), address);
    EXPECT_EQ(4U, address.getVersion());
}
