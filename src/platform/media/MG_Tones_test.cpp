#include "platform/media/MG_Tones.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>
#include <set>
#include <string>

using Tone = MG_Tones::ECallProgressTone;

TEST(MG_Tones, TheTonesThatEveryNetworkHasBearTheirNames)
{
    EXPECT_STREQ("dial tone", Tone::NAME(Tone::DIAL));
    EXPECT_STREQ("ringing tone", Tone::NAME(Tone::RINGING));
    EXPECT_STREQ("busy tone", Tone::NAME(Tone::BUSY));
    EXPECT_STREQ("congestion tone", Tone::NAME(Tone::CONGESTION));
    EXPECT_STREQ("special information tone", Tone::NAME(Tone::SPECIAL_INFORMATION));
    EXPECT_STREQ("warning tone", Tone::NAME(Tone::WARNING));
    EXPECT_STREQ("payphone recognition tone", Tone::NAME(Tone::PAYPHONE_RECOGNITION));
    EXPECT_STREQ("call waiting tone", Tone::NAME(Tone::CALL_WAITING));
    EXPECT_STREQ("caller waiting tone", Tone::NAME(Tone::CALLER_WAITING));
}

TEST(MG_Tones, NoToneIsTheValueZero)
{
    EXPECT_EQ(0, static_cast<int>(Tone::NONE));
    EXPECT_STREQ("no tone", Tone::NAME(Tone::Type{}));
}

TEST(MG_Tones, EveryToneHasANameOfItsOwn)
{
    std::set<std::string> names;
    for (int tone = Tone::NONE; tone <= Tone::CPE_ALERTING; ++tone)
    {
        std::string const name = Tone::NAME(static_cast<Tone::Type>(tone));
        EXPECT_NE(ERROR::INVALID, name) << tone;
        EXPECT_TRUE(names.insert(name).second) << name;
    }
}

TEST(MG_Tones, ANumberThatIsNoToneIsInvalid)
{
    EXPECT_STREQ(ERROR::INVALID, Tone::NAME(static_cast<Tone::Type>(-1)));
    EXPECT_STREQ(ERROR::INVALID, Tone::NAME(static_cast<Tone::Type>(Tone::CPE_ALERTING + 1)));
}
