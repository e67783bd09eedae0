#include "platform/media/VoipCodecListSet.h"

#include <gtest/gtest.h>

namespace
{
void ADD(VoipCodecListSet& set, VoipCodecListSet::Direction direction, MG_Rtp::ECodec::Type codec)
{
    EXPECT_TRUE(set.getList(direction).append(VoipCodec(codec, 20)).isOk());
}

String SHORT_INFO(VoipCodecListSet const& set)
{
    String text("replaced");
    EXPECT_EQ(&text, &set.getShortInfo(text));
    return text;
}
} // namespace

TEST(VoipCodecListSet, AnEmptySetPrintsNothing)
{
    EXPECT_TRUE(VoipCodecListSet().isEmpty());
    EXPECT_STREQ("", SHORT_INFO(VoipCodecListSet()).c_str());
}

TEST(VoipCodecListSet, TheListsPrintInTheirOrderWithHeadings)
{
    VoipCodecListSet set;
    ADD(set, VoipCodecListSet::RECEIVE_ONLY, MG_Rtp::ECodec::GSM);
    EXPECT_STREQ("receive-only: GSM 20ms", SHORT_INFO(set).c_str());
    ADD(set, VoipCodecListSet::SEND_RECEIVE, MG_Rtp::ECodec::PCMA);
    ADD(set, VoipCodecListSet::SEND_RECEIVE, MG_Rtp::ECodec::PCMU);
    EXPECT_STREQ("PCMA 20ms, PCMU 20ms; receive-only: GSM 20ms", SHORT_INFO(set).c_str());
    ADD(set, VoipCodecListSet::SEND_ONLY, MG_Rtp::ECodec::G729);
    EXPECT_STREQ("PCMA 20ms, PCMU 20ms; send-only: G729 20ms; receive-only: GSM 20ms", SHORT_INFO(set).c_str());
}

TEST(VoipCodecListSet, TheSameCodecInAnotherListIsAnotherSet)
{
    VoipCodecListSet left;
    VoipCodecListSet right;
    EXPECT_EQ(left, right);
    ADD(left, VoipCodecListSet::SEND_ONLY, MG_Rtp::ECodec::G729);
    EXPECT_FALSE(left.isEmpty());
    EXPECT_FALSE(left == right);
    ADD(right, VoipCodecListSet::RECEIVE_ONLY, MG_Rtp::ECodec::G729);
    EXPECT_FALSE(left == right);
    right = left;
    EXPECT_EQ(left, right);
}

TEST(VoipCodecListSet, TheEmptyOneIsSharedAndEqualsADefault)
{
    EXPECT_EQ(&VoipCodecListSet::EMPTY(), &VoipCodecListSet::EMPTY());
    EXPECT_EQ(VoipCodecListSet(), VoipCodecListSet::EMPTY());
}
