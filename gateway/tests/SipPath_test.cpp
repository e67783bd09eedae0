#include "sip/registrar/SipPath.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

namespace
{
SipMessage REGISTER(std::string const& headers)
{
    return SipMessage("REGISTER sip:host SIP/2.0\r\nVia: SIP/2.0/UDP host;branch=z9hG4bK1\r\nCall-ID: 1\r\n"
                      "CSeq: 1 REGISTER\r\nTo: <sip:alice@host>\r\nFrom: <sip:alice@host>;tag=a\r\n" +
                      headers + "\r\n");
}
} // namespace

TEST(SipPath, BecomesTheRouteBack)
{
    EXPECT_EQ(SipPath::READ(REGISTER("").get()), "");
    EXPECT_EQ(SipPath::READ(REGISTER("Path: <sip:192.0.2.1:5070;lr;received=sip:192.0.2.9>\r\n").get()),
              "<sip:192.0.2.1:5070;lr;received=sip:192.0.2.9>");
    EXPECT_EQ(SipPath::READ(REGISTER("Path: <sip:a@edge;lr>;x=y\r\nPath: \"B\" <sip:b;lr> , <sips:c;lr>\r\n").get()),
              "<sip:a@edge;lr>;x=y, \"B\" <sip:b;lr>, <sips:c;lr>");
}

TEST(SipPath, OfAProxyThatDoesNotRouteLooselyIsNone)
{
    EXPECT_FALSE(SipPath::READ(REGISTER("Path: <sip:192.0.2.1>\r\n").get()));
    EXPECT_FALSE(SipPath::READ(REGISTER("Path: <sip:192.0.2.1;lr>, <sip:192.0.2.2>\r\n").get()));
}

TEST(SipPath, IsNoLongerThanAnyNetworkNeeds)
{
    std::string line = "Path: <sip:192.0.2.1;lr>";
    for (unsigned int i = 0; i < 60; ++i)
        line += ", <sip:192.0.2.1;lr>";
    EXPECT_FALSE(SipPath::READ(REGISTER(line + "\r\n").get()));
}

TEST(SipPath, IsToldToWhoUnderstandsIt)
{
    std::string const route = "<sip:192.0.2.1;lr>";
    EXPECT_EQ(SipPath::GET_HEADER(REGISTER("Supported: timer, path\r\n").get(), route), "Path: " + route + "\r\n");
    EXPECT_EQ(SipPath::GET_HEADER(REGISTER("Supported: timer\r\n").get(), route), "");
    EXPECT_EQ(SipPath::GET_HEADER(REGISTER("Supported: path\r\n").get(), ""), "");
}
