#include "sip/message/SipAddress.h"

#include <gtest/gtest.h>

TEST(SipAddress, WhatTheUserPartDoesNotAllowIsEscaped)
{
    EXPECT_EQ(SipAddress::ESCAPE_USER("+4989-1.2"), "+4989-1.2");
    EXPECT_EQ(SipAddress::ESCAPE_USER("a b@c:d#\xc3\xa4%"), "a%20b%40c%3Ad%23%C3%A4%25");
}

TEST(SipAddress, EscapesAreReadAndMalformedOnesKept)
{
    EXPECT_EQ(SipAddress::UNESCAPE_USER("a%20b%40c%c3%A4"), "a b@c\xc3\xa4");
    EXPECT_EQ(SipAddress::UNESCAPE_USER("%"), "%");
    EXPECT_EQ(SipAddress::UNESCAPE_USER("%4"), "%4");
    EXPECT_EQ(SipAddress::UNESCAPE_USER("%zz%41"), "%zzA");
    EXPECT_EQ(SipAddress::UNESCAPE_USER("%41"), "A");
    EXPECT_EQ(SipAddress::UNESCAPE_USER("%4%31"), "%41");
}

TEST(SipAddress, EscapedControlCharactersAreKeptAsTheyAre)
{
    EXPECT_EQ(SipAddress::UNESCAPE_USER("44%0d%0AX%20y%00%7F"), "44%0d%0AX y%00%7F");
}

TEST(SipAddress, UrisNameUserAddressAndTransport)
{
    EXPECT_EQ(SipAddress::MAKE_URI("49", {"192.0.2.1", 5060}, SipWay::UDP), "sip:49@192.0.2.1:5060");
    EXPECT_EQ(SipAddress::MAKE_URI("", {"2001:db8::1", 1}, SipWay::TCP), "sip:[2001:db8::1]:1;transport=tcp");
    EXPECT_EQ(SipAddress::MAKE_URI("49", {"192.0.2.1", 5061}, SipWay::TLS), "sip:49@192.0.2.1:5061;transport=tls");
    EXPECT_EQ(SipAddress::MAKE_URI("49", {"192.0.2.1", 5061}, SipWay::SIPS), "sips:49@192.0.2.1:5061");
    EXPECT_EQ(SipAddress::MAKE_URI("49", {"sip.example", 0}, SipWay::UDP), "sip:49@sip.example;transport=udp");
    EXPECT_EQ(SipAddress::MAKE_URI("49", {"sip.example", 0}, SipWay::AS_NAMED), "sip:49@sip.example");
}

TEST(SipAddress, DisplayNamesAreQuoted)
{
    EXPECT_EQ(SipAddress::MAKE_NAME_ADDR("", "sip:x"), "<sip:x>");
    EXPECT_EQ(SipAddress::MAKE_NAME_ADDR("A \"B\" \\", "sip:x"), "\"A \\\"B\\\" \\\\\" <sip:x>");
    EXPECT_EQ(SipAddress::MAKE_NAME_ADDR("A\r\nVia: x", "sip:x"), "\"A  Via: x\" <sip:x>");
}
