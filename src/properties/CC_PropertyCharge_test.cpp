#include "properties/CC_PropertyCharge.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/AsnTesting.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

namespace
{
using Charge = CC_PropertyCharge::Charge;
using Specific = Charge::Specific;
using EMultiplier = Q956::EMultiplier;

Charge IN_CURRENCY(String const& currency, int amount, EMultiplier::Type multiplier)
{
    Charge charge;
    Specific& specific = charge.select(charge.m_specific);
    specific.m_typeOfChargingInfo = Q956::ETypeOfChargingInfo::TOTAL;
    Q956::RecordedCurrency& recorded = specific.m_recorded.select(specific.m_recorded.m_currency);
    recorded.m_rCurrency = currency;
    recorded.m_rAmount.m_currencyAmount = amount;
    recorded.m_rAmount.m_multiplier = multiplier;
    return charge;
}

/// An entry for not available, and one of three units of type 2.
Charge IN_UNITS()
{
    Charge charge;
    Specific& specific = charge.select(charge.m_specific);
    auto& list = specific.m_recorded.select(specific.m_recorded.m_unitsList);
    Q956::RecordedUnits units;
    units.m_recordedNumber.select(units.m_recordedNumber.m_notAvailable);
    EXPECT_TRUE(list.append(units).isOk());
    units.m_recordedNumber.select(units.m_recordedNumber.m_recordedNumberOfUnits) = 3;
    units.setPresent(units.m_recordedTypeOfUnits) = 2;
    EXPECT_TRUE(list.append(units).isOk());
    return charge;
}

std::string TEXT_OF(Charge const& charge) { return VALUE_OF(CC_PropertyCharge(CC_PropertyId::CHARGE, charge)); }
} // namespace

TEST(CC_PropertyCharge, NothingIsSelectedAtFirst)
{
    CC_PropertyCharge const property(CC_PropertyId::CHARGE);
    EXPECT_FALSE(property.getValue().hasSelection());
    EXPECT_EQ("", VALUE_OF(property));
    EXPECT_STREQ("Charge", property.getTypeName());
    EXPECT_STREQ("Charge", property.getPropertyName());
    EXPECT_STREQ("charge", property.getPropertyShortName());
}

TEST(CC_PropertyCharge, PrintsThatThereIsNoneOrThatItIsFree)
{
    Charge charge;
    charge.select(charge.m_chargeNotAvailable);
    EXPECT_EQ("N/A", TEXT_OF(charge));
    charge.select(charge.m_freeOfCharge);
    EXPECT_EQ("Free", TEXT_OF(charge));
}

TEST(CC_PropertyCharge, ScalesTheAmountByItsMultiplier)
{
    struct Case
    {
        int amount;
        EMultiplier::Type multiplier;
        char const* text;
    };
    for (Case const& row : {
             Case{1234, EMultiplier::ONE_HUNDREDTH, "EUR 12.34 (total)"},
             Case{5, EMultiplier::ONE_THOUSANDTH, "EUR 0.005 (total)"},
             Case{12345, EMultiplier::ONE_THOUSANDTH, "EUR 12.345 (total)"},
             Case{100, EMultiplier::ONE_HUNDREDTH, "EUR 1.00 (total)"},
             Case{19, EMultiplier::ONE_TENTH, "EUR 1.9 (total)"},
             Case{7, EMultiplier::ONE, "EUR 7 (total)"},
             Case{7, EMultiplier::TEN, "EUR 70 (total)"},
             Case{7, EMultiplier::HUNDRED, "EUR 700 (total)"},
             Case{7, EMultiplier::THOUSAND, "EUR 7000 (total)"},
             Case{16777215, EMultiplier::THOUSAND, "EUR -402654184 (total)"}, // 32 bits of the product
             Case{2147483647, EMultiplier::THOUSAND, "EUR -1000 (total)"},
             Case{-1234, EMultiplier::ONE_HUNDREDTH, "EUR -12.-34 (total)"}, // as "%d" prints the remainder
             Case{-5, EMultiplier::ONE_THOUSANDTH, "EUR 0.-005 (total)"},
             Case{7, static_cast<EMultiplier::Type>(7), "EUR 7 (total)"},
             Case{7, static_cast<EMultiplier::Type>(-1), "EUR 7 (total)"},
             Case{7, static_cast<EMultiplier::Type>(2147483647), "EUR 7 (total)"},
         })
        EXPECT_EQ(row.text, TEXT_OF(IN_CURRENCY("EUR", row.amount, row.multiplier)));
}

TEST(CC_PropertyCharge, TheCurrencyIsTakenWithItsLength)
{
    String text;
    CC_PropertyCharge const property(CC_PropertyId::CHARGE, IN_CURRENCY(String("E\0R", 3), 1, EMultiplier::ONE));
    EXPECT_TRUE(property.getValueString(text) == String("E\0R 1 (total)", 13));
}

TEST(CC_PropertyCharge, JoinsTheEntriesOfAUnitsList)
{
    EXPECT_EQ("N/A, 3 units of type 2 (subTotal)", TEXT_OF(IN_UNITS()));
    Charge charge;
    Specific& specific = charge.select(charge.m_specific);
    specific.m_recorded.select(specific.m_recorded.m_unitsList);
    EXPECT_EQ(" (subTotal)", TEXT_OF(charge));
}

TEST(CC_PropertyCharge, WithoutARecordedChargeOnlyTheRestIsPrinted)
{
    Charge charge;
    charge.select(charge.m_specific);
    EXPECT_EQ(" (subTotal)", TEXT_OF(charge));
}

TEST(CC_PropertyCharge, TheBillingIdStandsBeforeTheTypeOfChargingInformation)
{
    Charge charge = IN_UNITS();
    charge.m_specific.setPresent(charge.m_specific.m_billingId) = Q956::EAOCEBillingId::CALL_DEFLECTION;
    EXPECT_EQ("N/A, 3 units of type 2 (callDeflection) (subTotal)", TEXT_OF(charge));
    charge.m_specific.m_billingId = static_cast<Q956::EAOCEBillingId::Type>(8);
    charge.m_specific.m_typeOfChargingInfo = static_cast<Q956::ETypeOfChargingInfo::Type>(-1);
    EXPECT_EQ("N/A, 3 units of type 2 ((invalid)) ((invalid))", TEXT_OF(charge));
}

TEST(CC_PropertyCharge, ComparesTheCharges)
{
    CC_PropertyCharge const euro(CC_PropertyId::CHARGE, IN_CURRENCY("EUR", 1, EMultiplier::ONE));
    EXPECT_TRUE(euro.isEqual(CC_PropertyCharge(CC_PropertyId::CHARGE, IN_CURRENCY("EUR", 1, EMultiplier::ONE))));
    EXPECT_TRUE(euro.isEqual(CC_PropertyCharge(CC_PropertyId::TARIFF, IN_CURRENCY("EUR", 1, EMultiplier::ONE))));
    EXPECT_FALSE(euro.isEqual(CC_PropertyCharge(CC_PropertyId::CHARGE, IN_CURRENCY("EUR", 10, EMultiplier::ONE))));
    EXPECT_FALSE(euro.isEqual(CC_PropertyCharge(CC_PropertyId::CHARGE, IN_CURRENCY("CHF", 1, EMultiplier::ONE))));
    EXPECT_FALSE(euro.isEqual(CC_PropertyCharge(CC_PropertyId::CHARGE, IN_UNITS())));
    EXPECT_FALSE(euro.isEqual(CC_PropertyCharge(CC_PropertyId::CHARGE)));
    EXPECT_FALSE(euro.isEqual(CC_PropertyBoolean(CC_PropertyId::CHARGE)));
    EXPECT_TRUE(CC_PropertyCharge(CC_PropertyId::CHARGE).isEqual(CC_PropertyCharge(CC_PropertyId::CHARGE)));
}

TEST(CC_PropertyCharge, AssignsItsOwnClassOnlyAndClones)
{
    CC_PropertyCharge property(CC_PropertyId::CHARGE, IN_UNITS());
    property.assign(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    EXPECT_EQ("N/A, 3 units of type 2 (subTotal)", VALUE_OF(property));
    std::unique_ptr<CC_Property> const clone(property.clone());
    EXPECT_TRUE(clone->isEqual(property));
    EXPECT_TRUE(clone->isOfType(CC_PropertyCharge::TYPE_ID()));
    property.setValue(IN_CURRENCY("EUR", 1, EMultiplier::ONE));
    EXPECT_EQ("N/A, 3 units of type 2 (subTotal)", VALUE_OF(*clone));
    property.assign(*clone);
    EXPECT_TRUE(clone->isEqual(property));
}

TEST(CC_PropertyCharge, IsNotSetByText)
{
    CC_PropertyCharge property(CC_PropertyId::CHARGE, IN_UNITS());
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "Free"));
}

TEST(CC_PropertyCharge, AnAssignmentThatLacksMemoryChangesNothing)
{
    CC_PropertyCharge const source(CC_PropertyId::CHARGE, IN_UNITS());
    CC_PropertyCharge target(CC_PropertyId::CHARGE, IN_CURRENCY("EUR", 1, EMultiplier::ONE));
    EXPECT_EQ(1U, WITH_EACH_ALLOCATION_FAILING([&] { target.assign(source); },
                                               [&] { EXPECT_EQ("EUR 1 (total)", VALUE_OF(target)); }));
    EXPECT_TRUE(target.isEqual(source));
    CC_Property* clone = nullptr;
    EXPECT_EQ(2U, WITH_EACH_ALLOCATION_FAILING([&] { clone = source.clone(); }, [&] { EXPECT_EQ(nullptr, clone); }));
    delete clone;
}

TEST(CC_PropertyCharge, TravelsAsItsRecord)
{
    EXPECT_EQ("A315A110A10E8103455552A207810204D2820101820101",
              HEX(IN_CURRENCY("EUR", 1234, EMultiplier::ONE_HUNDREDTH)));
    EXPECT_EQ("A313A10EA20C300205003006020103020102820100", HEX(IN_UNITS()));
    EXPECT_EQ("REFUSED Charge: no alternative is selected", HEX(Charge()));
    Charge charge;
    charge.select(charge.m_specific);
    EXPECT_EQ("REFUSED Charge.specific.recorded: no alternative is selected", HEX(charge));
    Charge decoded = IN_UNITS();
    EXPECT_EQ("", DECODE(decoded, "8200"));
    EXPECT_TRUE(decoded.isSelected(decoded.m_freeOfCharge));
    EXPECT_EQ("Charge: cannot begin with [4], octet 0", DECODE(decoded, "8400"));
    EXPECT_EQ("Charge.chargeNotAvailable: NULL has no contents, octet 2", DECODE(decoded, "810100"));
    EXPECT_EQ("Charge: the length 5 runs past the end, octet 1", DECODE(decoded, "A305A1"));
    EXPECT_EQ("Charge.specific.recorded: has no alternative [3], octet 4", DECODE(decoded, "A307A102A300820101"));
}
