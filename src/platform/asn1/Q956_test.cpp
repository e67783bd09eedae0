#include "platform/asn1/Q956.h"

#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

TEST(Q956, AnAmountIsItsNumberAndMultiplier)
{
    Q956::Amount amount;
    amount.m_currencyAmount = 1234;
    amount.m_multiplier = Q956::EMultiplier::ONE_HUNDREDTH;
    EXPECT_EQ("3007810204D2820101", HEX(amount));
    EXPECT_EQ("{ currencyAmount 1234, multiplier oneHundredth }", PRINT(amount));
}

TEST(Q956, PositionTellsTheNumbersOfRecordedUnits)
{
    Q956::RecordedUnits units;
    EXPECT_EQ("", DECODE(units, "3006020105020102"));
    EXPECT_EQ(5, units.m_recordedNumber.m_recordedNumberOfUnits);
    EXPECT_EQ(2, units.m_recordedTypeOfUnits);
    EXPECT_EQ("", DECODE(units, "30050500020102"));
    EXPECT_TRUE(units.m_recordedNumber.isSelected(units.m_recordedNumber.m_notAvailable));
    EXPECT_TRUE(units.isPresent(units.m_recordedTypeOfUnits));
    EXPECT_EQ("", DECODE(units, "3003020105"));
    EXPECT_FALSE(units.isPresent(units.m_recordedTypeOfUnits));
    EXPECT_EQ("RecordedUnits: has no place for [UNIVERSAL 2], octet 8", DECODE(units, "3009020105020102020103"));
}

TEST(Q956, AChargedItemAndASpecialCodeDifferByTheirTags)
{
    Q956::AOCSCurrencyInfo info;
    EXPECT_EQ("", DECODE(info, "30060A010302010A"));
    EXPECT_EQ(Q956::EChargedItem::USER_TO_USER_INFO, info.m_chargedItem);
    EXPECT_EQ(10, info.m_aOCSCurrencyInfo.m_specialChargingCode);
    EXPECT_EQ("AOCSCurrencyInfo.chargedItem: is missing, octet 2", DECODE(info, "300602010A0A0103"));
}

TEST(Q956, RangesAreNotChecked)
{
    Q956::Amount amount;
    amount.m_currencyAmount = -1;
    EXPECT_EQ("30068101FF820100", HEX(amount));
    Q956::Currency currency;
    currency = "elevenchars";
    EXPECT_EQ("160B656C6576656E6368617273", HEX(currency));
    Q956::RecordedUnitsList const none;
    EXPECT_EQ("3000", HEX(none));
}

TEST(Q956, TheUnitsListIsAListWithAName)
{
    Q956::RecordedUnitsList list;
    ASSERT_NE(nullptr, list.append());
    list[0].m_recordedNumber.select(list[0].m_recordedNumber.m_notAvailable);
    EXPECT_EQ("300430020500", HEX(list));
    std::unique_ptr<AsnSyntax> const copy(list.clone());
    EXPECT_NE(nullptr, dynamic_cast<Q956::RecordedUnitsList*>(copy.get()));
    EXPECT_TRUE(copy->isEqual(list));
}
