#include "properties/CC_PropertyTariff.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/AsnTesting.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <vector>

namespace
{
using Tariff = CC_PropertyTariff::Tariff;
using Entry = Q956::AOCSCurrencyInfo;

void SET(Q956::Amount& amount, int number, Q956::EMultiplier::Type multiplier)
{
    amount.m_currencyAmount = number;
    amount.m_multiplier = multiplier;
}

void SET(Q956::Time& time, int length, Q956::EScale::Type scale)
{
    time.m_lengthOfTimeUnit = length;
    time.m_scale = scale;
}

Entry ENTRY(Q956::EChargedItem::Type item)
{
    Entry entry;
    entry.m_chargedItem = item;
    return entry;
}

Entry DURATION()
{
    Entry entry = ENTRY(Q956::EChargedItem::BASIC_COMMUNICATION);
    auto& specific = entry.m_aOCSCurrencyInfo.select(entry.m_aOCSCurrencyInfo.m_specificCurrency);
    Q956::DurationCurrency& rate = specific.select(specific.m_durationCurrency);
    rate.m_dCurrency = "EUR";
    SET(rate.m_dAmount, 5, Q956::EMultiplier::ONE_HUNDREDTH);
    SET(rate.m_dTime, 60, Q956::EScale::ONE_SECOND);
    rate.m_dChargingType = Q956::EChargingType::STEP_FUNCTION;
    return entry;
}

Entry FLAT(String const& currency)
{
    Entry entry = ENTRY(Q956::EChargedItem::CALL_SETUP);
    auto& specific = entry.m_aOCSCurrencyInfo.select(entry.m_aOCSCurrencyInfo.m_specificCurrency);
    Q956::FlatRateCurrency& rate = specific.select(specific.m_flatRateCurrency);
    rate.m_fRCurrency = currency;
    SET(rate.m_fRAmount, 10, Q956::EMultiplier::ONE_TENTH);
    return entry;
}

Entry FREE()
{
    Entry entry = ENTRY(Q956::EChargedItem::CALL_ATTEMPT);
    entry.m_aOCSCurrencyInfo.select(entry.m_aOCSCurrencyInfo.m_freeOfCharge);
    return entry;
}

Tariff LIST(std::vector<Entry> const& entries)
{
    Tariff tariff;
    auto& list = tariff.select(tariff.m_currencyInfoList);
    for (Entry const& entry : entries)
        EXPECT_TRUE(list.append(entry).isOk());
    return tariff;
}

std::string TEXT_OF(Tariff const& tariff) { return VALUE_OF(CC_PropertyTariff(CC_PropertyId::TARIFF, tariff)); }
} // namespace

TEST(CC_PropertyTariff, NothingIsSelectedAtFirst)
{
    CC_PropertyTariff const property(CC_PropertyId::TARIFF);
    EXPECT_FALSE(property.getValue().hasSelection());
    EXPECT_EQ("", VALUE_OF(property));
    EXPECT_STREQ("Tariff", property.getTypeName());
    EXPECT_STREQ("Tariff", property.getPropertyName());
    EXPECT_STREQ("tariff", property.getPropertyShortName());
}

TEST(CC_PropertyTariff, AWholeTariffThatIsNotAvailableIsWrittenSmall)
{
    Tariff tariff;
    tariff.select(tariff.m_chargeNotAvailable);
    EXPECT_EQ("n/a", TEXT_OF(tariff));
}

TEST(CC_PropertyTariff, PrintsASpecialArrangement)
{
    Tariff tariff;
    tariff.select(tariff.m_specialArrInfo) = -7;
    EXPECT_EQ("Special Arrangement -7", TEXT_OF(tariff));
}

TEST(CC_PropertyTariff, AnEmptyListPrintsNothing) { EXPECT_EQ("", TEXT_OF(LIST({}))); }

TEST(CC_PropertyTariff, PrintsADurationRate)
{
    Entry entry = DURATION();
    EXPECT_EQ("basicCommunication: Duration: EUR 5 * oneHundredth per 60 oneSecond (stepFunction)",
              TEXT_OF(LIST({entry})));
    Q956::DurationCurrency& rate = entry.m_aOCSCurrencyInfo.m_specificCurrency.m_durationCurrency;
    SET(rate.setPresent(rate.m_dGranularity), 10, Q956::EScale::TEN_SECONDS);
    rate.m_dChargingType = Q956::EChargingType::CONTINUOUS_CHARGING;
    EXPECT_EQ("basicCommunication: Duration: EUR 5 * oneHundredth per 60 oneSecond each 10 tenSeconds "
              "(continuousCharging)",
              TEXT_OF(LIST({entry})));
}

TEST(CC_PropertyTariff, PrintsAFlatRate)
{
    EXPECT_EQ("callSetup: Flat Rate: EUR 10 * oneTenth", TEXT_OF(LIST({FLAT("EUR")})));
}

TEST(CC_PropertyTariff, AVolumeRatesMultiplierStandsBehindPer)
{
    Entry entry = ENTRY(Q956::EChargedItem::USER_TO_USER_INFO);
    auto& specific = entry.m_aOCSCurrencyInfo.select(entry.m_aOCSCurrencyInfo.m_specificCurrency);
    Q956::VolumeRateCurrency& rate = specific.select(specific.m_volumeRateCurrency);
    rate.m_vRCurrency = "EUR";
    SET(rate.m_vRAmount, 3, Q956::EMultiplier::TEN);
    rate.m_vRVolumeUnit = Q956::EVolumeUnit::SEGMENT;
    EXPECT_EQ("userToUserInfo: Volume Rate: EUR 3 per ten segment", TEXT_OF(LIST({entry})));
}

TEST(CC_PropertyTariff, PrintsTheOtherKindsOfEntries)
{
    Entry entry = ENTRY(Q956::EChargedItem::OPERATION_OF_SUPPLEMENTARY_SERV);
    Entry::Info& info = entry.m_aOCSCurrencyInfo;
    EXPECT_EQ("operationOfSupplementaryServ: ", TEXT_OF(LIST({entry})));
    info.select(info.m_specificCurrency);
    EXPECT_EQ("operationOfSupplementaryServ: ", TEXT_OF(LIST({entry})));
    info.select(info.m_specialChargingCode) = 4;
    EXPECT_EQ("operationOfSupplementaryServ: Special: 4", TEXT_OF(LIST({entry})));
    info.select(info.m_freeOfCharge);
    EXPECT_EQ("operationOfSupplementaryServ: Free", TEXT_OF(LIST({entry})));
    info.select(info.m_currencyInfoNotAvailable);
    EXPECT_EQ("operationOfSupplementaryServ: N/A", TEXT_OF(LIST({entry})));
}

TEST(CC_PropertyTariff, JoinsTheEntriesInTheirOrder)
{
    EXPECT_EQ("callAttempt: Free, callSetup: Flat Rate: EUR 10 * oneTenth", TEXT_OF(LIST({FREE(), FLAT("EUR")})));
    EXPECT_EQ("callSetup: Flat Rate: EUR 10 * oneTenth, callAttempt: Free", TEXT_OF(LIST({FLAT("EUR"), FREE()})));
}

TEST(CC_PropertyTariff, NumbersWithoutANamePrintAsInvalid)
{
    Entry entry = DURATION();
    entry.m_chargedItem.setNumber(5);
    Q956::DurationCurrency& rate = entry.m_aOCSCurrencyInfo.m_specificCurrency.m_durationCurrency;
    rate.m_dAmount.m_multiplier.setNumber(7);
    rate.m_dTime.m_scale.setNumber(7);
    rate.m_dChargingType.setNumber(-1);
    EXPECT_EQ("(invalid): Duration: EUR 5 * (invalid) per 60 (invalid) ((invalid))", TEXT_OF(LIST({entry})));
}

TEST(CC_PropertyTariff, TheCurrencyIsTakenWithItsLength)
{
    String text;
    CC_PropertyTariff const property(CC_PropertyId::TARIFF, LIST({FLAT(String("E\0R", 3))}));
    EXPECT_TRUE(property.getValueString(text) == String("callSetup: Flat Rate: E\0R 10 * oneTenth", 39));
}

TEST(CC_PropertyTariff, ComparesTheTariffs)
{
    CC_PropertyTariff const flat(CC_PropertyId::TARIFF, LIST({FLAT("EUR")}));
    EXPECT_TRUE(flat.isEqual(CC_PropertyTariff(CC_PropertyId::TARIFF, LIST({FLAT("EUR")}))));
    EXPECT_FALSE(flat.isEqual(CC_PropertyTariff(CC_PropertyId::TARIFF, LIST({FLAT("CHF")}))));
    EXPECT_FALSE(flat.isEqual(CC_PropertyTariff(CC_PropertyId::TARIFF, LIST({FLAT("EUR"), FREE()}))));
    EXPECT_FALSE(flat.isEqual(CC_PropertyTariff(CC_PropertyId::TARIFF)));
    EXPECT_FALSE(CC_PropertyTariff(CC_PropertyId::TARIFF, LIST({})).isEqual(CC_PropertyTariff(CC_PropertyId::TARIFF)));
    // another class, whatever its content
    EXPECT_FALSE(CC_PropertyTariff(CC_PropertyId::TARIFF).isEqual(CC_PropertyCharge(CC_PropertyId::TARIFF)));
    EXPECT_FALSE(flat.isEqual(CC_PropertyBoolean(CC_PropertyId::TARIFF)));
}

TEST(CC_PropertyTariff, AssignsItsOwnClassOnlyAndClones)
{
    CC_PropertyTariff property(CC_PropertyId::TARIFF, LIST({FREE()}));
    property.assign(CC_PropertyCharge(CC_PropertyId::CHARGE));
    EXPECT_EQ("callAttempt: Free", VALUE_OF(property));
    std::unique_ptr<CC_Property> const clone(property.clone());
    EXPECT_TRUE(clone->isEqual(property));
    EXPECT_TRUE(clone->isOfType(CC_Property::TYPE_ID()));
    EXPECT_TRUE(clone->isOfType(CC_PropertyTariff::TYPE_ID()));
    EXPECT_FALSE(clone->isOfType(CC_PropertyCharge::TYPE_ID()));
    property.setValue(LIST({FLAT("EUR")}));
    EXPECT_EQ("callAttempt: Free", VALUE_OF(*clone));
    property.assign(*clone);
    EXPECT_TRUE(clone->isEqual(property));
}

TEST(CC_PropertyTariff, AnAssignmentThatLacksMemoryChangesNothing)
{
    CC_PropertyTariff const source(CC_PropertyId::TARIFF, LIST({FLAT("a currency of more than thirty letters")}));
    CC_PropertyTariff target(CC_PropertyId::TARIFF, LIST({FREE()}));
    EXPECT_EQ(2U, WITH_EACH_ALLOCATION_FAILING([&] { target.assign(source); },
                                               [&] { EXPECT_EQ("callAttempt: Free", VALUE_OF(target)); }));
    EXPECT_TRUE(target.isEqual(source));
}

TEST(CC_PropertyTariff, IsNotSetByText)
{
    CC_PropertyTariff property(CC_PropertyId::TARIFF, LIST({FREE()}));
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "n/a"));
}

TEST(CC_PropertyTariff, TravelsAsItsRecord)
{
    EXPECT_EQ("300730050A01018400", HEX(LIST({FREE()})));
    EXPECT_EQ("3000", HEX(LIST({})));
    Tariff tariff = LIST({FREE()});
    EXPECT_EQ("", DECODE(tariff, "02020001")); // not the shortest form of 1
    EXPECT_EQ("Special Arrangement 1", TEXT_OF(tariff));
    EXPECT_EQ("", DECODE(tariff, "02810101")); // nor the shortest length
    EXPECT_EQ("Special Arrangement 1", TEXT_OF(tariff));
    EXPECT_EQ("Tariff: is over, but the input goes on, octet 3", DECODE(tariff, "02010100"));
    EXPECT_EQ("", DECODE(tariff, "30800000"));
    EXPECT_TRUE(tariff == LIST({}));
    EXPECT_EQ("", DECODE(tariff, "0500"));
    EXPECT_EQ("n/a", TEXT_OF(tariff));
    EXPECT_EQ("Tariff: cannot begin with [1], octet 0", DECODE(tariff, "8100"));
    EXPECT_EQ("Tariff.currencyInfoList[0].aOCSCurrencyInfo: is missing, octet 7", DECODE(tariff, "300530030A0101"));
}
