#include "sip/access/SipDigest.h"

#include <gtest/gtest.h>

namespace
{
/// RFC 7616, 3.9.1.
SipDigest::Question EXAMPLE(SipDigest::Algorithm algorithm)
{
    return {algorithm,
            "GET",
            "/dir/index.html",
            "7ypf/xlj9XXwfDPEoM4URrv/xwf94BcCAzFZH4GiTo0v",
            "auth",
            "00000001",
            "f2/wE4q74E6zIJEtWaHKaf5wv/H5QzzpXusqGemxURZJ",
            ""};
}

std::string ANSWER(SipDigest::Algorithm algorithm)
{
    return SipDigest::RESPONSE(SipDigest::SECRET(algorithm, "Mufasa", "http-auth@example.org", "Circle of Life"),
                               EXAMPLE(algorithm));
}
} // namespace

TEST(SipDigest, TheExamplesOfTheStandardComeOut)
{
    EXPECT_EQ(ANSWER(SipDigest::MD5), "8ca523f5e9506fed4657c9700eebdbec");
    EXPECT_EQ(ANSWER(SipDigest::SHA_256), "753927fa0e85d155564e2e272a28d1802ca10daf4496794697cf8db5856cb6c1");
}

TEST(SipDigest, WithoutAQualityOfProtectionItIsTheOldOne) // RFC 2069, 2.4, with its erratum
{
    EXPECT_EQ(SipDigest::RESPONSE(
                  SipDigest::SECRET(SipDigest::MD5, "Mufasa", "testrealm@host.com", "CircleOfLife"),
                  {SipDigest::MD5, "GET", "/dir/index.html", "dcd98b7102dd2f0e8b11d0f600bfb0c093", "", "", "", ""}),
              "1949323746fe6a43ef61f9606e7febea");
}

TEST(SipDigest, TheBodyCountsWhereItIsProtected)
{
    SipDigest::Question question = EXAMPLE(SipDigest::MD5);
    question.quality = "auth-int";
    question.body = "v=0";
    std::string const one = SipDigest::RESPONSE("secret", question);
    question.body = "v=1";
    EXPECT_NE(SipDigest::RESPONSE("secret", question), one);
}

TEST(SipDigest, AlgorithmsAreNamedInAnyCase)
{
    EXPECT_EQ(SipDigest::NAMED(""), SipDigest::MD5);
    EXPECT_EQ(SipDigest::NAMED("md5"), SipDigest::MD5);
    EXPECT_EQ(SipDigest::NAMED("sha-256"), SipDigest::SHA_256);
    EXPECT_EQ(SipDigest::NAMED("SHA-512-256"), SipDigest::SHA_512_256);
    EXPECT_EQ(SipDigest::NAMED("MD5-sess"), std::nullopt);
    EXPECT_EQ(SipDigest::NAMED("AKAv1-MD5"), std::nullopt);
}

TEST(SipDigest, WhatIsRandomIsNeverTheSame)
{
    EXPECT_EQ(SipDigest::RANDOM(8).size(), 16u);
    EXPECT_NE(SipDigest::RANDOM(8), SipDigest::RANDOM(8));
}

TEST(SipDigest, TextsAreComparedWhole)
{
    EXPECT_TRUE(SipDigest::ARE_EQUAL("abc", "abc"));
    EXPECT_FALSE(SipDigest::ARE_EQUAL("abc", "abd"));
    EXPECT_FALSE(SipDigest::ARE_EQUAL("abc", "ab"));
    EXPECT_FALSE(SipDigest::ARE_EQUAL("abc", ""));
}
