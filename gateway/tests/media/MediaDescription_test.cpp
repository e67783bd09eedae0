#include "media/context/MediaDescription.h"

#include <gtest/gtest.h>

TEST(MediaAddress, IsReadFromTextAndWritten)
{
    EXPECT_EQ(MediaAddress::OF("192.0.2.10", 4000).text(), "192.0.2.10:4000");
    EXPECT_EQ(MediaAddress::OF("2001:db8::1", 4000).text(), "[2001:db8::1]:4000");
    EXPECT_FALSE(MediaAddress::OF("sip.example.org", 4000).isSomewhere());
    EXPECT_FALSE(MediaAddress::OF("10.0.0.0/8", 4000).isSomewhere());
}

TEST(MediaAddress, TheUnspecifiedAddressAndPortZeroAreNowhere)
{
    EXPECT_FALSE(MediaAddress::OF("0.0.0.0", 4000).isSomewhere());
    EXPECT_FALSE(MediaAddress::OF("::", 4000).isSomewhere());
    EXPECT_FALSE(MediaAddress::OF("192.0.2.10", 0).isSomewhere());
    EXPECT_TRUE(MediaAddress::OF("192.0.2.10", 1).isSomewhere());
}

TEST(MediaFormats, TakesCodecsWithAgreedNumbersAlone)
{
    MediaFormats formats;
    EXPECT_FALSE(formats.add({VoipCodec(), {0, 0}}));
    EXPECT_FALSE(formats.add({VoipCodec(MG_Rtp::ECodec::OPUS), {111, MediaPayloadTypes::NONE}}));
    EXPECT_FALSE(formats.add({VoipCodec(MG_Rtp::ECodec::OPUS), {128, 111}}));
    EXPECT_TRUE(formats.add({VoipCodec(MG_Rtp::ECodec::OPUS), {111, 96}}));
    ASSERT_NE(formats.find(MG_Rtp::ECodec::OPUS), nullptr);
    EXPECT_EQ(formats.find(MG_Rtp::ECodec::OPUS)->types.send, 96);
    EXPECT_EQ(formats.find(MG_Rtp::ECodec::PCMA), nullptr);
}

TEST(MediaFormats, IsFullAtEight)
{
    MediaFormats formats;
    for (unsigned char type = 0; type < MediaFormats::MOST; ++type)
        EXPECT_TRUE(formats.add({VoipCodec(MG_Rtp::ECodec::PCMA), {type, type}}));
    EXPECT_FALSE(formats.add({VoipCodec(MG_Rtp::ECodec::PCMA), {8, 8}}));
    EXPECT_EQ(formats.getSize(), MediaFormats::MOST);
}
