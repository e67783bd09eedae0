#include "platform/asn1/AsnNotation.h"

#include "platform/asn1/Q956.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

namespace
{
std::string DEFINITION(AsnSyntax const& value)
{
    String text;
    EXPECT_TRUE(AsnNotation::TYPE_OF(value, text).isOk());
    return text.c_str();
}
} // namespace

TEST(AsnNotation, PrintsTheDefinitionOfAStructure)
{
    EXPECT_EQ("DurationCurrency ::= SEQUENCE {\n"
              "    dCurrency [1] IMPLICIT Currency,\n"
              "    dAmount [2] IMPLICIT Amount,\n"
              "    dChargingType [3] IMPLICIT ChargingType,\n"
              "    dTime [4] IMPLICIT Time,\n"
              "    dGranularity [5] IMPLICIT Time OPTIONAL\n"
              "}",
              DEFINITION(Q956::DurationCurrency()));
    EXPECT_EQ("RecordedUnits ::= SEQUENCE {\n"
              "    recordedNumber CHOICE {\n"
              "        recordedNumberOfUnits NumberOfUnits,\n"
              "        notAvailable NULL\n"
              "    },\n"
              "    recordedTypeOfUnits TypeOfUnit OPTIONAL\n"
              "}",
              DEFINITION(Q956::RecordedUnits()));
}

TEST(AsnNotation, PrintsTheDefinitionOfOtherTypes)
{
    EXPECT_EQ("Currency ::= IA5String (SIZE (1..10))", DEFINITION(Q956::Currency()));
    EXPECT_EQ("TypeOfUnit ::= INTEGER (1..16)", DEFINITION(Q956::TypeOfUnit()));
    EXPECT_EQ("VolumeUnit ::= ENUMERATED {\n    octet (0),\n    segment (1),\n    message (2)\n}",
              DEFINITION(AsnEnumerated<Q956::EVolumeUnit>()));
    EXPECT_EQ("RecordedUnitsList ::= SEQUENCE SIZE (1..32) OF RecordedUnits", DEFINITION(Q956::RecordedUnitsList()));
    EXPECT_EQ("SEQUENCE OF ::= SEQUENCE OF Time", DEFINITION(AsnSequenceOf<Q956::Time>()));
    EXPECT_EQ("INTEGER ::= INTEGER", DEFINITION(AsnInteger()));
    EXPECT_EQ("NULL ::= NULL", DEFINITION(AsnNull()));
}

TEST(AsnNotation, PrintsValues)
{
    Q956::DurationCurrency rate;
    rate.m_dCurrency = "EUR";
    rate.m_dAmount.m_currencyAmount = -5;
    rate.m_dTime.m_scale = Q956::EScale::ONE_MINUTE;
    EXPECT_EQ("{ dCurrency \"EUR\", dAmount { currencyAmount -5, multiplier oneThousandth }, dChargingType "
              "continuousCharging, dTime { lengthOfTimeUnit 0, scale oneMinute } }",
              PRINT(rate));
    EXPECT_EQ("NULL", PRINT(AsnNull()));
    AsnEnumerated<Q956::EScale> scale;
    scale.setNumber(99);
    EXPECT_EQ("99", PRINT(scale));
    AsnSequenceOf<Q956::RecordedUnits> list;
    ASSERT_TRUE(list.append(Q956::RecordedUnits()).isOk());
    Q956::RecordedUnits::RecordedNumber& number = list[0].m_recordedNumber;
    number.select(number.m_recordedNumberOfUnits) = 3;
    ASSERT_TRUE(list.append(list[0]).isOk());
    EXPECT_EQ("{ { recordedNumber recordedNumberOfUnits : 3 }, { recordedNumber recordedNumberOfUnits : 3 } }",
              PRINT(list));
}

TEST(AsnNotation, QuotesTextsAndSpellsControlCharacters)
{
    struct Case
    {
        String text;
        char const* notation;
    };
    for (Case const& row :
         {Case{"", "\"\""}, Case{"a \"b\"", "\"a \"\"b\"\"\""}, Case{String("a\0b", 3), "{ \"a\", {0, 0}, \"b\" }"},
          Case{"\x7f\n", "{ {7, 15}, {0, 10} }"}})
    {
        AsnIA5String value;
        value = row.text;
        EXPECT_EQ(row.notation, PRINT(value));
    }
}

TEST(AsnNotation, ATypeWithoutANameIsNamedByItsKind)
{
    EXPECT_STREQ("CHOICE", AsnNotation::NAME_OF(Q956::RecordedUnits::RecordedNumber()));
    EXPECT_STREQ("SEQUENCE OF", AsnNotation::NAME_OF(AsnSequenceOf<Q956::Time>()));
    EXPECT_STREQ("Time", AsnNotation::NAME_OF(Q956::Time()));
}
