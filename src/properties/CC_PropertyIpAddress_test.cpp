#include "properties/CC_PropertyIpAddress.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyIpAddress, ReadsHostsAndNetworks)
{
    CC_PropertyIpAddress property(CC_PropertyId::IP_ADDRESS);
    String error("untouched");
    for (char const* const text : {"192.0.2.1", "10.0.0.0/8", "2001:db8::1", "2001:db8::/32"})
    {
        EXPECT_EQ(XCode::OK, property.setValueString(error, text)) << text;
        EXPECT_EQ(text, VALUE_OF(property));
    }
    EXPECT_STREQ("untouched", error.c_str());
}

TEST(CC_PropertyIpAddress, RefusesWhatIsNoAddress)
{
    CC_PropertyIpAddress property(CC_PropertyId::IP_ADDRESS);
    String error;
    ASSERT_TRUE(property.setValueString(error, "192.0.2.1").isOk());
    for (char const* const text : {"", "localhost", "192.0.2", "192.0.2.256", "10.0.0.0/33", "2001:db8:::1"})
        EXPECT_EQ("Invalid IP-Address", REFUSAL_OF(property, text)) << text;
}

TEST(CC_PropertyIpAddress, RefusesTheUnspecifiedAddress)
{
    CC_PropertyIpAddress property(CC_PropertyId::IP_ADDRESS);
    String error;
    ASSERT_TRUE(property.setValueString(error, "192.0.2.1").isOk());
    for (char const* const text : {"0.0.0.0", "::"})
        EXPECT_EQ("Invalid host or network address", REFUSAL_OF(property, text)) << text;
}

TEST(CC_PropertyIpAddress, ComparesAddressesAsThePlatformDoes)
{
    IpAddress address;
    ASSERT_TRUE(address.setIpAddrAsString("192.0.2.1").isOk());
    CC_PropertyIpAddress const host(CC_PropertyId::IP_ADDRESS, address);
    ASSERT_TRUE(address.setIpAddrAsString("192.0.2.1/32").isOk());
    CC_PropertyIpAddress const network(CC_PropertyId::IP_ADDRESS, address);
    EXPECT_FALSE(host.isEqual(network));
    EXPECT_TRUE(host.isEqual(CC_PropertyIpAddress(host)));
    EXPECT_FALSE(host.isEqual(CC_PropertyIpAddress(CC_PropertyId::IP_ADDRESS)));
}
