#include "sip/access/SipCredentials.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

namespace
{
/// A request that is signed, and answered with challenges.
class SipCredentialsTest : public testing::Test
{
protected:
    void SetUp() override { request = MAKE_REQUEST(); }
    void TearDown() override { msg_destroy(request); }

    static msg_t* MAKE_REQUEST()
    {
        std::string const text = "BYE sip:bob@host SIP/2.0\r\nCall-ID: 1\r\nCSeq: 2 BYE\r\nFrom: <sip:a@h>;tag=a\r\n"
                                 "To: <sip:b@h>;tag=b\r\nContent-Length: 0\r\n\r\n";
        return msg_make(sip_default_mclass(), 0, text.data(), static_cast<ssize_t>(text.size()));
    }

    bool take(std::string const& headers, unsigned int tries = 0, char const* status = "401 Unauthorized")
    {
        SipMessage const answer("SIP/2.0 " + std::string(status) + "\r\nCall-ID: 1\r\nCSeq: 2 BYE\r\n" +
                                "Via: SIP/2.0/UDP h;branch=z9hG4bK1\r\nFrom: <sip:a@h>;tag=a\r\n" +
                                "To: <sip:b@h>;tag=b\r\n" + headers + "\r\n");
        return credentials.take(sip_object(request), answer.get(), tries);
    }
    std::string shown(char const* parameter)
    {
        credentials.sign(request);
        sip_authorization_t const* const header = sip_object(request)->sip_authorization;
        return header != nullptr ? SipChallenge::PARAMETER(*header, parameter) : "none";
    }

    msg_t* request = nullptr;
    SipCredentials credentials{"a", "4420",
                               std::make_shared<SipPasswords const>(SipPasswords::PARSE(
                                   "4420:r:secret\n4420:hashed:{SHA-256}" + std::string(64, '0') + "\n", "f"))};
};

std::string CHALLENGE(std::string const& parameters) { return "WWW-Authenticate: Digest " + parameters + "\r\n"; }
} // namespace

TEST_F(SipCredentialsTest, WhoWasNotAskedShowsNothing) { EXPECT_EQ(shown("username"), "none"); }

TEST_F(SipCredentialsTest, WhoWasAskedOnceShowsThemFromThenOnAndCounts)
{
    ASSERT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"n\", qop=\"auth\", algorithm=SHA-256, opaque=\"o\"")));
    EXPECT_EQ(shown("nc"), "00000001");
    EXPECT_EQ(shown("nc"), "00000002");
    std::string const count = shown("nc");
    sip_authorization_t const& header = *sip_object(request)->sip_authorization;
    EXPECT_EQ(header.au_next, nullptr); // one of the three
    std::string const clientNonce = SipChallenge::PARAMETER(header, "cnonce");
    EXPECT_EQ(SipChallenge::PARAMETER(header, "uri"), "sip:bob@host");
    EXPECT_EQ(SipChallenge::PARAMETER(header, "opaque"), "o");
    EXPECT_EQ(SipChallenge::PARAMETER(header, "response"),
              SipDigest::RESPONSE(SipDigest::SECRET(SipDigest::SHA_256, "4420", "r", "secret"),
                                  {SipDigest::SHA_256, "BYE", "sip:bob@host", "n", "auth", count, clientNonce, ""}));
}

TEST_F(SipCredentialsTest, TheFirstAlgorithmThatCanBeIsTaken)
{
    ASSERT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"n\", algorithm=TIGER") +
                     CHALLENGE("realm=\"r\", nonce=\"n\", algorithm=SHA-256") +
                     CHALLENGE("realm=\"r\", nonce=\"n\", algorithm=MD5")));
    EXPECT_EQ(shown("algorithm"), "SHA-256");
}

TEST_F(SipCredentialsTest, AHashIsOfUseForItsAlgorithmAlone)
{
    EXPECT_FALSE(take(CHALLENGE("realm=\"hashed\", nonce=\"n\"")));
    EXPECT_TRUE(take(CHALLENGE("realm=\"hashed\", nonce=\"n\"") +
                     CHALLENGE("realm=\"hashed\", nonce=\"n\", algorithm=SHA-256")));
    EXPECT_EQ(shown("algorithm"), "SHA-256");
}

TEST_F(SipCredentialsTest, WrongCredentialsAreShownOnce)
{
    ASSERT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"n\"")));
    shown("nc");
    EXPECT_FALSE(take(CHALLENGE("realm=\"r\", nonce=\"m\""), 1));
    EXPECT_EQ(credentials.getCounters().answered, 1u);
    EXPECT_EQ(credentials.getCounters().refused, 1u);
}

TEST_F(SipCredentialsTest, AStaleNonceIsReplacedAFewTimes)
{
    std::string const stale = CHALLENGE("realm=\"r\", nonce=\"n\", stale=TRUE");
    ASSERT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"m\"")));
    shown("nc");
    EXPECT_TRUE(take(stale, 1));
    EXPECT_TRUE(take(stale, 3));
    EXPECT_FALSE(take(stale, 4));
}

TEST_F(SipCredentialsTest, WhatWasShownUnaskedIsShownAgainForAnotherNonce)
{
    ASSERT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"n\"")));
    shown("nc"); // the next request
    EXPECT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"m\""), 0));
    EXPECT_EQ(shown("nonce"), "m");
}

TEST_F(SipCredentialsTest, EachRealmOnTheWayGetsItsOwn)
{
    ASSERT_TRUE(take(CHALLENGE("realm=\"r\", nonce=\"n\"")));
    shown("nc");
    EXPECT_TRUE(
        take("Proxy-Authenticate: Digest realm=\"r\", nonce=\"p\"\r\n", 1, "407 Proxy Authentication Required"));
    EXPECT_EQ(shown("nonce"), "n");
    ASSERT_NE(sip_object(request)->sip_proxy_authorization, nullptr);
    EXPECT_EQ(SipChallenge::PARAMETER(*sip_object(request)->sip_proxy_authorization, "nonce"), "p");
}

TEST_F(SipCredentialsTest, WhatCannotBeAnsweredStands)
{
    EXPECT_FALSE(take(CHALLENGE("realm=\"nobody's\", nonce=\"n\"")));
    EXPECT_FALSE(take(CHALLENGE("realm=\"r\"")));
    EXPECT_FALSE(take(CHALLENGE("nonce=\"n\"")));
    EXPECT_FALSE(take(CHALLENGE("realm=\"r\", nonce=\"n\", qop=\"token\"")));
    EXPECT_FALSE(take("WWW-Authenticate: Basic realm=\"r\"\r\n"));
    EXPECT_FALSE(take(""));
    EXPECT_EQ(shown("username"), "none");
    EXPECT_FALSE(take(CHALLENGE("realm=\"r\", nonce=\"n\""), 0, "403 Forbidden"));
    EXPECT_EQ(credentials.getCounters().refused, 6u);
}
