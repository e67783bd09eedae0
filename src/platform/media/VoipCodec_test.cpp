#include "platform/media/VoipCodec.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
String SHORT_INFO(VoipCodec const& codec)
{
    String text("replaced");
    EXPECT_EQ(&text, &codec.getShortInfo(text));
    return text;
}
} // namespace

TEST(VoipCodec, TheShortInfoReplacesItsTargetByNameAndPeriod)
{
    EXPECT_STREQ("PCMA 20ms", SHORT_INFO(VoipCodec(MG_Rtp::ECodec::PCMA, 20)).c_str());
}

TEST(VoipCodec, AnOpenPacketPeriodIsNotPrinted)
{
    EXPECT_STREQ("opus", SHORT_INFO(VoipCodec(MG_Rtp::ECodec::OPUS)).c_str());
}

TEST(VoipCodec, NoCodecPrintsNothing)
{
    EXPECT_EQ(MG_Rtp::ECodec::NONE, VoipCodec().getCodec());
    EXPECT_STREQ("", SHORT_INFO(VoipCodec()).c_str());
    EXPECT_STREQ("", SHORT_INFO(VoipCodec(MG_Rtp::ECodec::NONE, 20)).c_str());
}

TEST(VoipCodec, AnUnknownCodecPrintsAsInvalid)
{
    String const expected = String(ERROR::INVALID) + " 10ms";
    EXPECT_EQ(expected, SHORT_INFO(VoipCodec(static_cast<MG_Rtp::ECodec::Type>(99), 10)));
}

TEST(VoipCodec, CodecAndPeriodMakeItTheSame)
{
    VoipCodec const codec(MG_Rtp::ECodec::G729, 20);
    VoipCodec const copy = codec;
    EXPECT_EQ(codec, copy);
    EXPECT_EQ((MG_Rtp::MediaType{MG_Rtp::ECodec::G729, 20}), copy.getMediaType());
    EXPECT_EQ(20U, copy.getPacketPeriod());
    EXPECT_FALSE(codec == VoipCodec(MG_Rtp::ECodec::G729, 30));
    EXPECT_FALSE(codec == VoipCodec(MG_Rtp::ECodec::GSM, 20));
    EXPECT_FALSE(codec == VoipCodec());
}
