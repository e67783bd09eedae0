#include "sip/access/SipNonces.h"

#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

namespace
{
InternetAddress ADDRESS(unsigned char last) { return {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 192, 0, 2, last}; }

class SipNoncesTest : public testing::Test
{
protected:
    DrivenClock clock;
    SipNonces nonces{2};
};
} // namespace

TEST_F(SipNoncesTest, OneOfOursIsOfItsAddress)
{
    std::string const nonce = nonces.make(ADDRESS(1));
    EXPECT_TRUE(nonces.isOurs(nonce, ADDRESS(1)));
    EXPECT_FALSE(nonces.isOurs(nonce, ADDRESS(2)));
    EXPECT_FALSE(SipNonces().isOurs(nonce, ADDRESS(1))); // of another process
    EXPECT_NE(nonces.make(ADDRESS(1)), nonce);
}

TEST_F(SipNoncesTest, OneThatWasTouchedIsNotOurs)
{
    std::string const nonce = nonces.make(ADDRESS(1));
    for (std::size_t i = 0; i < nonce.size(); ++i)
    {
        std::string touched = nonce;
        touched[i] = touched[i] == '0' ? '1' : '0';
        EXPECT_FALSE(nonces.isOurs(touched, ADDRESS(1))) << i;
    }
    EXPECT_FALSE(nonces.isOurs(nonce + "0", ADDRESS(1)));
    EXPECT_FALSE(nonces.isOurs("", ADDRESS(1)));
}

TEST_F(SipNoncesTest, EveryCountServesOnce)
{
    std::string const nonce = nonces.make(ADDRESS(1));
    EXPECT_EQ(nonces.use(nonce, 1), SipNonces::GOOD);
    EXPECT_EQ(nonces.use(nonce, 1), SipNonces::REPLAYED);
    EXPECT_EQ(nonces.use(nonce, 4), SipNonces::GOOD);
    EXPECT_EQ(nonces.use(nonce, 3), SipNonces::GOOD); // overtaken
    EXPECT_EQ(nonces.use(nonce, 3), SipNonces::REPLAYED);
    EXPECT_EQ(nonces.use(nonce, 4), SipNonces::REPLAYED);
    EXPECT_EQ(nonces.use(nonce, 0), SipNonces::REPLAYED);
    EXPECT_EQ(nonces.use(nonce, 0xffffffffu), SipNonces::GOOD);
    EXPECT_EQ(nonces.use(nonce, 2), SipNonces::REPLAYED); // too far behind to be known
    EXPECT_EQ(nonces.use(nonce, 0xffffffffu), SipNonces::REPLAYED);
}

TEST_F(SipNoncesTest, ItExpires)
{
    std::string const nonce = nonces.make(ADDRESS(1));
    clock.advance(SipNonces::LIFETIME * 1000);
    EXPECT_EQ(nonces.use(nonce, 1), SipNonces::GOOD);
    clock.advance(1000);
    EXPECT_EQ(nonces.use(nonce, 2), SipNonces::EXPIRED);
    EXPECT_TRUE(nonces.isOurs(nonce, ADDRESS(1)));
}

TEST_F(SipNoncesTest, WhatWasForgottenIsNotTakenAgain)
{
    std::string const first = nonces.make(ADDRESS(1));
    std::string const unused = nonces.make(ADDRESS(1));
    EXPECT_EQ(nonces.use(first, 1), SipNonces::GOOD);
    for (int i = 0; i < 2; ++i)
    {
        clock.advance(1000);
        EXPECT_EQ(nonces.use(nonces.make(ADDRESS(1)), 1), SipNonces::GOOD);
    }
    EXPECT_EQ(nonces.use(first, 1), SipNonces::EXPIRED);
    EXPECT_EQ(nonces.use(unused, 1), SipNonces::EXPIRED);
}
