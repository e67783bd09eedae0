#include "platform/media/VoipCodecList.h"

#include <gtest/gtest.h>
#include <initializer_list>

namespace
{
VoipCodec const s_pcma(MG_Rtp::ECodec::PCMA, 20);
VoipCodec const s_pcmu(MG_Rtp::ECodec::PCMU, 20);
VoipCodec const s_g729(MG_Rtp::ECodec::G729, 20);

VoipCodecList LIST_OF(std::initializer_list<VoipCodec> codecs)
{
    VoipCodecList list;
    for (VoipCodec const& codec : codecs)
        EXPECT_TRUE(list.append(codec).isOk());
    return list;
}

String SHORT_INFO(VoipCodecList const& list)
{
    String text("replaced");
    EXPECT_EQ(&text, &list.getShortInfo(text));
    return text;
}
} // namespace

TEST(VoipCodecList, CodecsKeepTheOrderOfPreference)
{
    VoipCodecList const list = LIST_OF({s_g729, s_pcma, s_pcmu});
    ASSERT_EQ(3U, list.getSize());
    EXPECT_EQ(s_g729, list[0]);
    EXPECT_EQ(s_pcma, list[1]);
    EXPECT_EQ(s_pcmu, list[2]);
    EXPECT_STREQ("G729 20ms, PCMA 20ms, PCMU 20ms", SHORT_INFO(list).c_str());
}

TEST(VoipCodecList, AnEmptyListPrintsNothing)
{
    EXPECT_TRUE(VoipCodecList().isEmpty());
    EXPECT_STREQ("", SHORT_INFO(VoipCodecList()).c_str());
}

TEST(VoipCodecList, ACodecIsListedOnceButAnotherPeriodIsAnotherCodec)
{
    VoipCodecList list = LIST_OF({s_pcma});
    EXPECT_EQ(XCode::REFUSED, list.append(s_pcma));
    EXPECT_EQ(1U, list.getSize());
    EXPECT_TRUE(list.append(VoipCodec(MG_Rtp::ECodec::PCMA, 30)).isOk());
    EXPECT_EQ(2U, list.getSize());
}

TEST(VoipCodecList, NoCodecIsRefused)
{
    VoipCodecList list;
    EXPECT_EQ(XCode::REFUSED, list.append(VoipCodec()));
    EXPECT_TRUE(list.isEmpty());
}

TEST(VoipCodecList, TheSameCodecsInAnotherOrderAreAnotherList)
{
    EXPECT_EQ(LIST_OF({s_pcma, s_pcmu}), LIST_OF({s_pcma, s_pcmu}));
    EXPECT_FALSE(LIST_OF({s_pcma, s_pcmu}) == LIST_OF({s_pcmu, s_pcma}));
    EXPECT_FALSE(LIST_OF({s_pcma}) == LIST_OF({s_pcma, s_pcmu}));
}

TEST(VoipCodecList, ACopyGoesItsOwnWay)
{
    VoipCodecList const original = LIST_OF({s_pcma});
    VoipCodecList copy = original;
    ASSERT_TRUE(copy.append(s_pcmu).isOk());
    EXPECT_FALSE(original.contains(s_pcmu));
    copy.clear();
    EXPECT_TRUE(copy.isEmpty());
    EXPECT_TRUE(original.contains(s_pcma));
}
