#include "platform/media/VoipCodecAndMode.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
VoipCodec const s_pcma(MG_Rtp::ECodec::PCMA, 20);

String SHORT_INFO(VoipCodecAndMode const& codec)
{
    String text("replaced");
    EXPECT_EQ(&text, &codec.getShortInfo(text));
    return text;
}
} // namespace

TEST(VoipCodecAndMode, OnlyAModeOtherThanBothWaysIsPrinted)
{
    EXPECT_STREQ("PCMA 20ms", SHORT_INFO(VoipCodecAndMode(s_pcma)).c_str());
    EXPECT_STREQ("PCMA 20ms send-only", SHORT_INFO(VoipCodecAndMode(s_pcma, VoipCodecAndMode::SEND_ONLY)).c_str());
    EXPECT_STREQ("PCMA 20ms receive-only",
                 SHORT_INFO(VoipCodecAndMode(s_pcma, VoipCodecAndMode::RECEIVE_ONLY)).c_str());
    EXPECT_STREQ("PCMA 20ms inactive", SHORT_INFO(VoipCodecAndMode(s_pcma, VoipCodecAndMode::INACTIVE)).c_str());
}

TEST(VoipCodecAndMode, WithoutACodecNothingIsPrintedWhateverTheMode)
{
    EXPECT_STREQ("", SHORT_INFO(VoipCodecAndMode()).c_str());
    EXPECT_STREQ("", SHORT_INFO(VoipCodecAndMode(VoipCodec(), VoipCodecAndMode::INACTIVE)).c_str());
}

TEST(VoipCodecAndMode, CodecAndModeMakeItTheSame)
{
    VoipCodecAndMode const held(s_pcma, VoipCodecAndMode::SEND_ONLY);
    VoipCodecAndMode const copy = held;
    EXPECT_EQ(held, copy);
    EXPECT_EQ(s_pcma, copy.getCodec());
    EXPECT_EQ(VoipCodecAndMode::SEND_ONLY, copy.getMode());
    EXPECT_FALSE(held == VoipCodecAndMode(s_pcma));
    EXPECT_FALSE(held == VoipCodecAndMode(VoipCodec(MG_Rtp::ECodec::PCMU, 20), VoipCodecAndMode::SEND_ONLY));
}

TEST(VoipCodecAndMode, TheEmptyOneIsSharedAndEqualsADefault)
{
    EXPECT_EQ(&VoipCodecAndMode::EMPTY(), &VoipCodecAndMode::EMPTY());
    EXPECT_EQ(VoipCodecAndMode(), VoipCodecAndMode::EMPTY());
}

TEST(VoipCodecAndMode, AForeignModeIsInvalid)
{
    EXPECT_STREQ("send-receive", VoipCodecAndMode::MODE_NAME(VoipCodecAndMode::SEND_RECEIVE));
    EXPECT_STREQ(ERROR::INVALID, VoipCodecAndMode::MODE_NAME(static_cast<VoipCodecAndMode::Mode>(4)));
    EXPECT_STREQ(ERROR::INVALID, VoipCodecAndMode::MODE_NAME(static_cast<VoipCodecAndMode::Mode>(-1)));
}
