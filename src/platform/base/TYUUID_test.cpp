#include "platform/base/TYUUID.h"

#include <gtest/gtest.h>

namespace
{
TY::UUID::Octets const s_octets{0x00, 0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77,
                                0x88, 0x99, 0xaa, 0xbb, 0xcc, 0xdd, 0xee, 0xff};
}

TEST(TYUUID, OctetsPrintInFiveLowerCaseGroups)
{
    EXPECT_STREQ("00112233-4455-6677-8899-aabbccddeeff", TY::UUID(s_octets).getString().c_str());
}

TEST(TYUUID, OnlyTheOneOfZerosIsInvalid)
{
    EXPECT_FALSE(TY::UUID().isValid());
    EXPECT_FALSE(TY::UUID::INVALID().isValid());
    EXPECT_EQ(TY::UUID(), TY::UUID::INVALID());
    EXPECT_STREQ("00000000-0000-0000-0000-000000000000", TY::UUID::INVALID().getString().c_str());
    for (std::size_t i = 0; i < 16; ++i)
    {
        TY::UUID::Octets octets{};
        octets[i] = 1;
        EXPECT_TRUE(TY::UUID(octets).isValid()) << i;
    }
}

TEST(TYUUID, EveryOctetCountsInComparisons)
{
    TY::UUID const identity(s_octets);
    EXPECT_EQ(TY::UUID(s_octets), identity);
    TY::UUID::Octets other = s_octets;
    other[15] = 0xfe;
    EXPECT_FALSE(TY::UUID(other) == identity);
}
