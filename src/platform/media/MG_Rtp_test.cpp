#include "platform/media/MG_Rtp.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    MG_Rtp::ECodec::Type codec;
    int number;
    char const* name;
};
constexpr Case s_cases[] = {
    {MG_Rtp::ECodec::NONE, -1, "None"},
    {MG_Rtp::ECodec::PCMU, 0, "PCMU"},
    {MG_Rtp::ECodec::GSM, 3, "GSM"},
    {MG_Rtp::ECodec::G723, 4, "G723"},
    {MG_Rtp::ECodec::DVI4_8000, 5, "DVI4/8000"},
    {MG_Rtp::ECodec::DVI4_16000, 6, "DVI4/16000"},
    {MG_Rtp::ECodec::LPC, 7, "LPC"},
    {MG_Rtp::ECodec::PCMA, 8, "PCMA"},
    {MG_Rtp::ECodec::G722, 9, "G722"},
    {MG_Rtp::ECodec::L16_STEREO, 10, "L16/44100/2"},
    {MG_Rtp::ECodec::L16_MONO, 11, "L16/44100"},
    {MG_Rtp::ECodec::QCELP, 12, "QCELP"},
    {MG_Rtp::ECodec::G728, 15, "G728"},
    {MG_Rtp::ECodec::G729, 18, "G729"},
    {MG_Rtp::ECodec::G726_16, 128, "G726-16"},
    {MG_Rtp::ECodec::G726_24, 129, "G726-24"},
    {MG_Rtp::ECodec::G726_32, 130, "G726-32"},
    {MG_Rtp::ECodec::G726_40, 131, "G726-40"},
    {MG_Rtp::ECodec::ILBC, 132, "iLBC"},
    {MG_Rtp::ECodec::OPUS, 133, "opus"},
    {MG_Rtp::ECodec::CLEARMODE, 134, "CLEARMODE"},
};
} // namespace

TEST(MG_Rtp, ACodecWithAFixedPayloadTypeHasItAsItsNumber)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.codec)) << row.name;
        EXPECT_STREQ(row.name, MG_Rtp::ECodec::NAME(row.codec)) << row.number;
    }
}

TEST(MG_Rtp, APayloadTypeOfNoCodecIsInvalid)
{
    for (int const number : {-2, 1, 2, 13, 19, 96, 101, 127, 135})
        EXPECT_STREQ(ERROR::INVALID, MG_Rtp::ECodec::NAME(static_cast<MG_Rtp::ECodec::Type>(number))) << number;
}

TEST(MG_Rtp, AMediaTypeIsBornWithoutCodecAndComparesBothFields)
{
    MG_Rtp::MediaType const none;
    EXPECT_EQ(MG_Rtp::ECodec::NONE, none.codec);
    EXPECT_EQ(0U, none.packetPeriod);

    MG_Rtp::MediaType const pcma20{MG_Rtp::ECodec::PCMA, 20};
    EXPECT_EQ((MG_Rtp::MediaType{MG_Rtp::ECodec::PCMA, 20}), pcma20);
    EXPECT_FALSE(pcma20 == (MG_Rtp::MediaType{MG_Rtp::ECodec::PCMA, 30}));
    EXPECT_FALSE(pcma20 == (MG_Rtp::MediaType{MG_Rtp::ECodec::PCMU, 20}));
}
