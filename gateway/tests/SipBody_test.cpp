#include "sip/message/SipBody.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

namespace
{
constexpr char const* SDP = "v=0\r\no=x 1 1 IN IP4 h\r\n";

SipBody READ(std::string_view body, std::string_view type, std::string_view encoding = {},
             std::string_view disposition = {})
{
    return SipBody::READ(body, type, encoding, disposition);
}

std::string PART(std::string const& headers, std::string const& body)
{
    return "--b\r\n" + headers + "\r\n" + body + "\r\n";
}

std::string const SESSION = PART("Content-Type: application/sdp\r\n", SDP);
std::string const END = "--b--\r\n";
} // namespace

TEST(SipBody, ASessionDescriptionIsTaken)
{
    EXPECT_EQ(READ(SDP, "application/sdp").session, SDP);
    EXPECT_EQ(READ(SDP, "Application/SDP ; charset=utf-8").session, SDP);
    EXPECT_EQ(READ(SDP, "application/sdp", {}, "session;handling=required").session, SDP);
    EXPECT_EQ(READ(SDP, "application/sdp", "identity").session, SDP);
}

TEST(SipBody, NoBodyIsNoObstacle)
{
    EXPECT_TRUE(READ("", "text/plain").isUnderstood());
    EXPECT_TRUE(READ("", "").session.empty());
}

TEST(SipBody, WhatIsNotUnderstoodIsInTheWayUnlessItIsOptional)
{
    EXPECT_EQ(READ("hello", "text/plain").obstacle, SipBody::TYPE);
    EXPECT_EQ(READ("hello", "").obstacle, SipBody::TYPE);
    EXPECT_EQ(READ(SDP, "application/sdp", "gzip").obstacle, SipBody::ENCODING);
    EXPECT_EQ(READ(SDP, "application/sdp", {}, "early-session").obstacle, SipBody::TYPE);
    EXPECT_EQ(READ("hello", "text/plain", {}, "render;handling=required").obstacle, SipBody::TYPE);
    for (char const* const type : {"text/plain", "application/isup; version=itu-t92+"})
    {
        SipBody const body = READ("hello", type, {}, "signal ; handling=OPTIONAL");
        EXPECT_TRUE(body.isUnderstood());
        EXPECT_TRUE(body.session.empty());
    }
    EXPECT_TRUE(READ(SDP, "application/sdp", "gzip", "session;handling=optional").session.empty());
}

TEST(SipBody, TheDescriptionOfAMultipartIsTakenAndOptionalPartsAreLeft)
{
    std::string const isup =
        PART("Content-Type: application/ISUP;version=itu-t92+\r\nContent-Disposition: signal;handling=optional\r\n",
             std::string("\x01\x00\n--\r\n--bb\r\n", 12));
    for (std::string const& body :
         {SESSION + isup + END, isup + SESSION + END, "preamble\r\n" + isup + SESSION + END + "rest"})
    {
        SipBody const read = READ(body, "multipart/mixed;boundary=b");
        EXPECT_TRUE(read.isUnderstood());
        EXPECT_EQ(read.session, SDP);
    }
    EXPECT_EQ(READ(SESSION + END, "multipart/mixed; boundary=\"b\"").session, SDP);
}

TEST(SipBody, APartThatIsNeededAndNotUnderstoodIsInTheWay)
{
    EXPECT_EQ(
        READ(SESSION + PART("Content-Type: application/ISUP\r\n", "x") + END, "multipart/mixed;boundary=b").obstacle,
        SipBody::TYPE);
    EXPECT_EQ(READ(PART("Content-Type: application/sdp\r\nContent-Encoding: gzip\r\n", "x") + END,
                   "multipart/mixed;boundary=b")
                  .obstacle,
              SipBody::ENCODING);
    EXPECT_EQ(READ(PART("c: application/sdp\r\nContent-Transfer-Encoding: base64\r\n", "x") + END,
                   "multipart/mixed;boundary=b")
                  .obstacle,
              SipBody::ENCODING);
    EXPECT_EQ(READ(PART("", "hello") + END, "multipart/mixed;boundary=b").obstacle, SipBody::TYPE);
    EXPECT_EQ(READ(SESSION + END, "multipart/related;boundary=b").obstacle, SipBody::TYPE);
}

TEST(SipBody, OfSeveralDescriptionsTheFirstOfAMixtureAndTheLastOfAlternativesWins)
{
    std::string const other = PART("Content-Type: application/sdp\r\n", "v=1");
    EXPECT_EQ(READ(SESSION + other + END, "multipart/mixed;boundary=b").session, SDP);
    EXPECT_EQ(READ(other + SESSION + END, "multipart/alternative;boundary=b").session, SDP);
    EXPECT_EQ(
        READ(SESSION + PART("Content-Type: text/html\r\n", "x") + END, "multipart/alternative;boundary=b").session,
        SDP);
    EXPECT_FALSE(
        READ(PART("Content-Type: text/html\r\n", "x") + END, "multipart/alternative;boundary=b").isUnderstood());
}

TEST(SipBody, AMultipartInsideAnotherIsReadAndOneWithoutEndIsNot)
{
    std::string const inner = PART("Content-Type: multipart/alternative;boundary=\"c d\"\r\n",
                                   "--c d\r\nContent-Type: application/sdp\r\n\r\n" + std::string(SDP) + "\r\n--c d--");
    EXPECT_EQ(READ(inner + END, "multipart/mixed;boundary=b").session, SDP);
    for (std::string const& body :
         {SESSION, std::string("--b"), std::string("--b\r\n"), std::string("x"), std::string("--b--")})
        EXPECT_TRUE(READ(body, "multipart/mixed;boundary=b").session.empty()) << body;
    EXPECT_FALSE(READ(SESSION, "multipart/mixed;boundary=b").isUnderstood());
    EXPECT_FALSE(READ(SESSION + END, "multipart/mixed").isUnderstood());
    EXPECT_FALSE(READ(SESSION + END, "multipart/mixed;boundary=c").isUnderstood());
}

TEST(SipBody, AnEndlessNestIsGivenUp)
{
    std::string body = SESSION + END;
    for (int i = 0; i < 100; ++i)
        body = PART("Content-Type: multipart/mixed;boundary=b\r\n", body) + END;
    EXPECT_FALSE(READ(body, "multipart/mixed;boundary=b").isUnderstood());
    std::string many;
    for (int i = 0; i < 100; ++i)
        many += SESSION;
    EXPECT_FALSE(READ(many + END, "multipart/mixed;boundary=b").isUnderstood());
}

TEST(SipBody, TheHeadersOfAMessageSayWhatItsBodyIs)
{
    auto const read = [](std::string const& headers, std::string const& body)
    {
        SipMessage const invite("INVITE sip:4989@host SIP/2.0\r\nVia: SIP/2.0/UDP host;branch=z9hG4bK1\r\nCall-ID: "
                                "1\r\nCSeq: 1 INVITE\r\nTo: <sip:a@h>\r\nFrom: <sip:b@h>;tag=a\r\n" +
                                headers + "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body);
        return SipBody::READ(invite.get());
    };
    EXPECT_EQ(read("Content-Type: application/sdp\r\n", SDP).session, SDP);
    EXPECT_EQ(read("Content-Type: application/sdp\r\nContent-Encoding: gzip\r\n", SDP).obstacle, SipBody::ENCODING);
    EXPECT_EQ(read("Content-Type: application/sdp\r\ne: identity, deflate\r\n", SDP).obstacle, SipBody::ENCODING);
    EXPECT_EQ(read("Content-Type: text/plain\r\n", "hello").obstacle, SipBody::TYPE);
    EXPECT_TRUE(
        read("Content-Type: text/plain\r\nContent-Disposition: render;handling=optional\r\n", "x").isUnderstood());
    EXPECT_EQ(read("Content-Type: multipart/mixed;boundary=\"b\"\r\n", SESSION + END).session, SDP);
    EXPECT_EQ(read("", SDP).obstacle, SipBody::TYPE);
    EXPECT_TRUE(read("", "").isUnderstood());
}
