#include "configuration/AddressRange.h"

#include <gtest/gtest.h>

#include <netinet/in.h>
#include <stdexcept>

namespace
{
bool CONTAINS(char const* range, char const* address)
{
    return AddressRange::PARSE(range).contains(AddressRange::PARSE(address).getFirst());
}

std::string COMPLAINT(char const* text)
{
    try
    {
        AddressRange::PARSE(text);
    }
    catch (std::invalid_argument const& error)
    {
        return error.what();
    }
    return "none";
}
} // namespace

TEST(AddressRange, APrefixEndsAtAnyBit)
{
    EXPECT_TRUE(CONTAINS("192.0.2.7", "192.0.2.7"));
    EXPECT_FALSE(CONTAINS("192.0.2.7", "192.0.2.6"));
    EXPECT_TRUE(CONTAINS("192.0.2.0/24", "192.0.2.255"));
    EXPECT_FALSE(CONTAINS("192.0.2.0/24", "192.0.3.0"));
    EXPECT_TRUE(CONTAINS("192.0.2.64/27", "192.0.2.95"));
    EXPECT_FALSE(CONTAINS("192.0.2.64/27", "192.0.2.96"));
    EXPECT_TRUE(CONTAINS("2001:db8::/33", "2001:db8:7fff::1"));
    EXPECT_FALSE(CONTAINS("2001:db8::/33", "2001:db8:8000::1"));
}

TEST(AddressRange, EverythingOfOneVersionIsNothingOfTheOther)
{
    EXPECT_TRUE(CONTAINS("0.0.0.0/0", "255.1.2.3"));
    EXPECT_FALSE(CONTAINS("0.0.0.0/0", "2001:db8::1"));
    EXPECT_FALSE(CONTAINS("0.0.0.0/0", "::1"));
    EXPECT_TRUE(CONTAINS("::/0", "2001:db8::1"));
}

TEST(AddressRange, AnAddressOfVersion4IsTheSameInsideVersion6)
{
    EXPECT_TRUE(CONTAINS("192.0.2.0/24", "::ffff:192.0.2.1"));
}

TEST(AddressRange, TheSystemsAddressesAreRead)
{
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    EXPECT_TRUE(AddressRange::PARSE("127.0.0.0/8")
                    .contains(AddressRange::ADDRESS_OF(reinterpret_cast<sockaddr const&>(address))));
    sockaddr_in6 address6 = {};
    address6.sin6_family = AF_INET6;
    address6.sin6_addr = in6addr_loopback;
    EXPECT_TRUE(
        AddressRange::PARSE("::1").contains(AddressRange::ADDRESS_OF(reinterpret_cast<sockaddr const&>(address6))));
}

TEST(AddressRange, WhatIsNoRangeIsRefusedWithTheReason)
{
    EXPECT_EQ(COMPLAINT("host"), "'host' is not an address");
    EXPECT_EQ(COMPLAINT(""), "'' is not an address");
    EXPECT_EQ(COMPLAINT("192.0.2.0/33"), "'33' is not the length of a prefix");
    EXPECT_EQ(COMPLAINT("192.0.2.0/"), "'' is not the length of a prefix");
    EXPECT_EQ(COMPLAINT("2001:db8::/129"), "'129' is not the length of a prefix");
    EXPECT_EQ(COMPLAINT("192.0.2.1/24"), "'192.0.2.1/24' has bits beyond its prefix");
}
