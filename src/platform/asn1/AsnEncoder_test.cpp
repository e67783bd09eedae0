#include "platform/asn1/AsnEncoder.h"

#include "platform/asn1/AsnPrimitive.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

TEST(AsnEncoder, LengthsTakeTheShortestForm)
{
    struct Case
    {
        std::size_t length;
        char const* header;
    };
    for (Case const& row : {Case{0, "1600"}, Case{127, "167F"}, Case{128, "168180"}, Case{255, "1681FF"},
                            Case{256, "16820100"}, Case{65535, "1682FFFF"}, Case{65536, "1683010000"}})
    {
        AsnIA5String text;
        text = String(std::string(row.length, 'x').c_str());
        std::string const hex = HEX(text);
        EXPECT_EQ(row.header, hex.substr(0, hex.size() - 2 * row.length));
        AsnIA5String decoded;
        EXPECT_EQ("", DECODE(decoded, hex));
        EXPECT_TRUE(decoded == text);
    }
}

TEST(AsnEncoder, TagsTakeAsManyOctetsAsTheyNeed)
{
    struct Case
    {
        unsigned int flags;
        unsigned int number;
        char const* hex;
    };
    for (Case const& row : {Case{AsnTag::UNIVERSAL, 5, "0500"}, Case{AsnTag::APPLICATION, 30, "5E00"},
                            Case{AsnTag::CONTEXT, 31, "9F1F00"}, Case{AsnTag::PRIVATE, 127, "DF7F00"},
                            Case{AsnTag::CONTEXT, 128, "9F810000"}, Case{AsnTag::CONTEXT, 16384, "9F81800000"},
                            Case{AsnTag::CONTEXT, AsnTag::MAX_NUMBER, "9FFFFFFF7F00"}})
    {
        AsnPrimitive value(row.flags, row.number);
        EXPECT_EQ(row.hex, HEX(value));
        EXPECT_EQ("", DECODE(value, row.hex));
    }
}

TEST(AsnEncoder, ReplacesWhatTheOctetsHeld)
{
    AsnOctets octets;
    ASSERT_TRUE(octets.append(1).isOk());
    String error;
    EXPECT_TRUE(AsnNull().encode(octets, error).isOk());
    ASSERT_EQ(2U, octets.getSize());
    EXPECT_EQ(5, octets[0]);
    EXPECT_TRUE(error.isEmpty());
}
