#include "platform/asn1/ASN_CHOICE.h"

#include "platform/asn1/AsnPrimitive.h"
#include "platform/asn1/AsnSequence.h"
#include "platform/asn1/Q956.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

namespace
{
using Number = Q956::RecordedUnits::RecordedNumber;
using Info = Q956::AOCSCurrencyInfo::Info;

/// A choice under a tag, which cannot replace any other.
class Wrapping : public AsnClass<Wrapping, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "Wrapping";
    Wrapping() { declareWrapping(); }

    Number m_number;

private:
    void declareWrapping()
    {
        static constexpr AsnField FIELDS[] = {AsnField::OF<&Wrapping::m_number>("number", AsnImplicit(7))};
        declare(FIELDS);
    }
};
} // namespace

TEST(ASN_CHOICE, WithoutASelectionThereIsNothingToEncode)
{
    Number const number;
    EXPECT_FALSE(number.hasSelection());
    EXPECT_EQ("REFUSED CHOICE: no alternative is selected", HEX(number));
    EXPECT_EQ("", PRINT(number));
    Q956::RecordedUnits const units;
    EXPECT_EQ("REFUSED RecordedUnits.recordedNumber: no alternative is selected", HEX(units));
}

TEST(ASN_CHOICE, ARefusedEncodingLeavesTheOctetsAsTheyWere)
{
    AsnOctets octets;
    ASSERT_TRUE(octets.append(7).isOk());
    String error;
    EXPECT_EQ(XCode::REFUSED, Number().encode(octets, error));
    ASSERT_EQ(1U, octets.getSize());
    EXPECT_EQ(7, octets[0]);
}

TEST(ASN_CHOICE, OnlyTheSameSelectionIsEqual)
{
    Number one;
    Number other;
    EXPECT_TRUE(one == other);
    one.select(one.m_recordedNumberOfUnits);
    EXPECT_FALSE(one == other);
    EXPECT_FALSE(other == one);
    other.select(other.m_notAvailable);
    EXPECT_FALSE(one == other);
    other.select(other.m_recordedNumberOfUnits);
    EXPECT_TRUE(one == other);
    other.m_recordedNumberOfUnits = 1;
    EXPECT_FALSE(one == other);
}

TEST(ASN_CHOICE, AnotherSelectionResetsTheFormer)
{
    Number number;
    number.m_recordedNumberOfUnits = 3; // set before it is selected: stays
    number.select(number.m_recordedNumberOfUnits);
    EXPECT_EQ(3, number.m_recordedNumberOfUnits);
    number.select(number.m_recordedNumberOfUnits);
    EXPECT_EQ(3, number.m_recordedNumberOfUnits);
    number.select(number.m_notAvailable);
    EXPECT_TRUE(number.isSelected(number.m_notAvailable));
    EXPECT_FALSE(number.isSelected(number.m_recordedNumberOfUnits));
    EXPECT_EQ(0, number.m_recordedNumberOfUnits);
    number.selectNothing();
    EXPECT_FALSE(number.hasSelection());
}

TEST(ASN_CHOICE, AnUntaggedChoiceInAChoiceAddsNothing)
{
    Info info;
    Q956::AOCSCurrencyInfo::SpecificCurrency& specific = info.select(info.m_specificCurrency);
    EXPECT_EQ("REFUSED CHOICE.specificCurrency: no alternative is selected", HEX(info));
    specific.select(specific.m_flatRateCurrency).m_fRCurrency = "EUR";
    EXPECT_EQ("A20D8103455552A206810100820100", HEX(info));
    Info decoded;
    EXPECT_EQ("", DECODE(decoded, "A20D8103455552A206810100820100"));
    EXPECT_TRUE(decoded == info);
    EXPECT_EQ("", DECODE(decoded, "8400"));
    EXPECT_TRUE(decoded.isSelected(decoded.m_freeOfCharge));
    EXPECT_EQ("", DECODE(decoded, "02010A"));
    EXPECT_EQ(10, decoded.m_specialChargingCode);
    EXPECT_EQ("CHOICE: cannot begin with [6], octet 0", DECODE(decoded, "8600"));
}

TEST(ASN_CHOICE, ATagBecomesAWrapper)
{
    Wrapping wrapping;
    wrapping.m_number.select(wrapping.m_number.m_recordedNumberOfUnits) = 5;
    EXPECT_EQ("3005A703020105", HEX(wrapping));
    Wrapping decoded;
    EXPECT_EQ("", DECODE(decoded, "3005A703020105"));
    EXPECT_TRUE(decoded == wrapping);
    EXPECT_EQ("", DECODE(decoded, "3080A780020105 0000 0000"));
    EXPECT_TRUE(decoded == wrapping);
    EXPECT_EQ("Wrapping.number: must be constructed, octet 2", DECODE(decoded, "30058703020105"));
    EXPECT_EQ("Wrapping.number: the input ends where an element should begin, octet 4", DECODE(decoded, "3002A700"));
    EXPECT_EQ("Wrapping.number: holds more than one alternative, octet 7", DECODE(decoded, "3007A7050201050500"));
    EXPECT_EQ("Wrapping.number: has no alternative [UNIVERSAL 1], octet 4", DECODE(decoded, "3005A703010105"));
    EXPECT_EQ("Wrapping.number: is missing, octet 2", DECODE(decoded, "3003020105"));
}

TEST(ASN_CHOICE, ACopyKeepsTheSelection)
{
    Number number;
    number.select(number.m_recordedNumberOfUnits) = 4;
    std::unique_ptr<AsnSyntax> const clone(number.clone());
    EXPECT_TRUE(clone->isEqual(number));
    Number assigned;
    assigned.select(assigned.m_notAvailable);
    assigned = number;
    EXPECT_TRUE(assigned.isSelected(assigned.m_recordedNumberOfUnits)); // its own, not the other's
    EXPECT_EQ(4, assigned.m_recordedNumberOfUnits);
    assigned.reset();
    EXPECT_TRUE(assigned == Number());
}
