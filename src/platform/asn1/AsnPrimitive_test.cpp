#include "platform/asn1/AsnPrimitive.h"

#include "platform/asn1/Q956_Enumerations.h"
#include "tests/support/AsnTesting.h"

#include <climits>
#include <gtest/gtest.h>

namespace
{
AsnIA5String TEXT(String const& text)
{
    AsnIA5String value;
    value = text;
    return value;
}
} // namespace

TEST(AsnPrimitive, NumbersTakeTheShortestForm)
{
    struct Case
    {
        int number;
        char const* hex;
    };
    for (Case const& row :
         {Case{0, "020100"}, Case{127, "02017F"}, Case{128, "02020080"}, Case{255, "020200FF"}, Case{256, "02020100"},
          Case{32767, "02027FFF"}, Case{32768, "0203008000"}, Case{8388607, "02037FFFFF"},
          Case{8388608, "020400800000"}, Case{INT_MAX, "02047FFFFFFF"}, Case{-1, "0201FF"}, Case{-128, "020180"},
          Case{-129, "0202FF7F"}, Case{-32768, "02028000"}, Case{-32769, "0203FF7FFF"}, Case{INT_MIN, "020480000000"}})
    {
        AsnInteger number;
        number = row.number;
        EXPECT_EQ(row.hex, HEX(number));
        AsnInteger decoded;
        EXPECT_EQ("", DECODE(decoded, row.hex));
        EXPECT_EQ(row.number, decoded.getNumber());
        EXPECT_TRUE(decoded == number);
    }
}

TEST(AsnPrimitive, NumbersMayRepeatTheirSignButNotPass32Bits)
{
    AsnInteger number;
    EXPECT_EQ("", DECODE(number, "02020001"));
    EXPECT_EQ(1, number);
    EXPECT_EQ("", DECODE(number, "0209000000000000000005"));
    EXPECT_EQ(5, number);
    EXPECT_EQ("", DECODE(number, "0206FFFFFFFFFF7F"));
    EXPECT_EQ(-129, number);
    EXPECT_EQ("", DECODE(number, "0205007FFFFFFF"));
    EXPECT_EQ(INT_MAX, number);
    EXPECT_EQ("", DECODE(number, "0205FF80000000"));
    EXPECT_EQ(INT_MIN, number);
    EXPECT_EQ("INTEGER: the number does not fit 32 bits, octet 2", DECODE(number, "02050080000000"));
    EXPECT_EQ("INTEGER: the number does not fit 32 bits, octet 2", DECODE(number, "0205FF7FFFFFFF"));
    EXPECT_EQ("INTEGER: the number does not fit 32 bits, octet 2", DECODE(number, "02050100000000"));
    EXPECT_EQ("INTEGER: a number needs an octet, octet 2", DECODE(number, "0200"));
    EXPECT_EQ("INTEGER: must be primitive, octet 0", DECODE(number, "2203020101"));
    EXPECT_EQ(INT_MIN, number);
}

TEST(AsnPrimitive, AnUnsignedNumberTravelsAsItsBitPattern)
{
    AsnPrimitiveNativeWithTag<unsigned int, AsnTag::UNIVERSAL, AsnTag::INTEGER> counter;
    counter = 4294967295U;
    EXPECT_EQ("0201FF", HEX(counter));
    EXPECT_EQ("", DECODE(counter, "020480000000"));
    EXPECT_EQ(2147483648U, counter);
}

TEST(AsnPrimitive, NullHasNoContents)
{
    AsnNull null;
    EXPECT_EQ("0500", HEX(null));
    EXPECT_EQ("", DECODE(null, "0500"));
    EXPECT_EQ("", DECODE(null, "058100"));
    EXPECT_EQ("NULL: NULL has no contents, octet 2", DECODE(null, "050100"));
    EXPECT_EQ("NULL: must be primitive, octet 0", DECODE(null, "2500"));
    EXPECT_TRUE(null == AsnNull());
}

TEST(AsnPrimitive, APrimitiveBuiltWithATagIsThatTypesNull)
{
    AsnPrimitive null(0x10000000, 5);
    EXPECT_EQ("0500", HEX(null));
    AsnPrimitive const other(AsnTag::APPLICATION, 3);
    EXPECT_EQ("4300", HEX(other));
    EXPECT_FALSE(null == other);
    EXPECT_TRUE(null == AsnPrimitive(AsnTag::UNIVERSAL, AsnTag::NULL_TYPE));
    EXPECT_FALSE(null == AsnNull()); // another class
    EXPECT_EQ("", DECODE(null, "0500"));
    std::unique_ptr<AsnSyntax> const copy(null.clone());
    EXPECT_TRUE(copy->isEqual(null));
}

TEST(AsnPrimitive, TheTagsFlagsAndNumberAreThoseThatItWasBuiltWith)
{
    AsnPrimitiveDerivedWithTag<AsnNullWrapper, 268435456, 5> const null;
    EXPECT_EQ(268435456U, null.getTag().getFlags());
    EXPECT_EQ(5U, null.getTag().getNumber());
    EXPECT_EQ(AsnTag(AsnTag::UNIVERSAL, AsnTag::INTEGER), AsnInteger().getTag());
    EXPECT_TRUE(AsnTag().isNone());
    EXPECT_FALSE(null.getTag().isNone());
}

TEST(AsnPrimitive, TextsKeepEveryOctetBelow128)
{
    EXPECT_EQ("1603455552", HEX(TEXT("EUR")));
    EXPECT_EQ("1600", HEX(TEXT("")));
    AsnIA5String text;
    EXPECT_EQ("", DECODE(text, "1603410042"));
    EXPECT_TRUE(text.get() == String("A\0B", 3));
    EXPECT_EQ("1603410042", HEX(text));
    EXPECT_FALSE(text == TEXT("A"));
    EXPECT_EQ("", DECODE(text, "1600"));
    EXPECT_TRUE(text.get().isEmpty());
}

TEST(AsnPrimitive, TextsBeyondIA5AreRefusedBothWays)
{
    EXPECT_EQ("REFUSED IA5String: A4 at position 1 is no IA5 character", HEX(TEXT("a\xa4")));
    AsnIA5String text;
    EXPECT_EQ("IA5String: 80 is no IA5 character, octet 3", DECODE(text, "16034180C3"));
}

TEST(AsnPrimitive, TextsMayComeInSegments)
{
    AsnIA5String text;
    EXPECT_EQ("", DECODE(text, "36 08 04 02 4142 04 02 4344"));
    EXPECT_EQ("ABCD", text.get());
    EXPECT_EQ("", DECODE(text, "36 80 04 01 45 24 80 04 01 46 0000 04 00 0000"));
    EXPECT_EQ("EF", text.get());
    EXPECT_EQ("", DECODE(text, "3600"));
    EXPECT_EQ("", text.get());
    EXPECT_EQ("IA5String: has a segment that is no OCTET STRING but [UNIVERSAL 22], octet 2",
              DECODE(text, "3603160141"));
    EXPECT_EQ("IA5String: 80 is no IA5 character, octet 4", DECODE(text, "3603040180"));
}

TEST(AsnPrimitive, UnknownEnumerationNumbersSurvive)
{
    AsnEnumerated<Q956::EScale> scale;
    EXPECT_EQ("0A0100", HEX(scale));
    scale = Q956::EScale::ONE_HOUR;
    EXPECT_EQ("0A0105", HEX(scale));
    EXPECT_EQ("", DECODE(scale, "0A0107"));
    EXPECT_EQ(7, scale);
    EXPECT_STREQ("(invalid)", Q956::EScale::NAME(scale));
    EXPECT_EQ("0A0107", HEX(scale));
    EXPECT_EQ("", DECODE(scale, "0A0480000000"));
    EXPECT_EQ("0A0480000000", HEX(scale));
    EXPECT_EQ("Scale: the number does not fit 32 bits, octet 2", DECODE(scale, "0A050100000000"));
}

TEST(AsnPrimitive, ResettingGivesTheInitialValue)
{
    AsnInteger number;
    number = 5;
    number.reset();
    EXPECT_EQ(0, number);
    AsnIA5String text = TEXT("x");
    text.reset();
    EXPECT_TRUE(text == AsnIA5String());
    AsnPrimitive null(AsnTag::APPLICATION, 3);
    null.reset();
    EXPECT_EQ("4300", HEX(null));
}
