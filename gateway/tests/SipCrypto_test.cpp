#include "sip/dialog/SipCrypto.h"

#include <gtest/gtest.h>

#include <string>

namespace
{
std::string const KEY = "inline:d0RmdmcmVCspeEc3QGZiNWpVLFJhQX1cfHAwJSoj"; // RFC 4568, 4.1's
} // namespace

TEST(SipCrypto, IsReadWithItsKey)
{
    std::optional<SipCrypto> const crypto = SipCrypto::READ("7 AES_CM_128_HMAC_SHA1_80 " + KEY + "|2^20 WSH=128");
    ASSERT_TRUE(crypto.has_value());
    EXPECT_EQ(crypto->tag, 7u);
    EXPECT_EQ(crypto->suite, MediaKeys::AES_CM_128_HMAC_SHA1_80);
    EXPECT_EQ(std::string(crypto->key.begin(), crypto->key.end()), "wDfvg&T+)xG7@fb5jU,RaA}\\|p0%*#");
}

TEST(SipCrypto, ComesBackAsItWasWritten)
{
    SipCrypto const made = SipCrypto::MAKE(2, MediaKeys::AES_CM_128_HMAC_SHA1_32);
    EXPECT_EQ(SipCrypto::READ(made.write()), made);
    EXPECT_NE(SipCrypto::MAKE(2, MediaKeys::AES_CM_128_HMAC_SHA1_32).key, made.key);
}

TEST(SipCrypto, WhatWouldBeSecuredOtherwiseIsNone)
{
    std::string const suite = "AES_CM_128_HMAC_SHA1_80 ";
    for (std::string const& value :
         {"0 " + suite + KEY, "x " + suite + KEY, "1 F8_128_HMAC_SHA1_80 " + KEY, "1 " + suite + KEY.substr(0, 46),
          "1 " + suite + KEY + "AAAA", "1 " + suite + KEY + "|2^20|1:4", "1 " + suite + KEY + ";" + KEY,
          "1 " + suite + KEY + " UNENCRYPTED_SRTP", "1 " + suite + KEY + " KDR=1", "1 " + suite, std::string("1"),
          std::string()})
        EXPECT_FALSE(SipCrypto::READ(value).has_value()) << value;
}
