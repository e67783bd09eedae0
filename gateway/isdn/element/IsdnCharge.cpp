#include "isdn/element/IsdnCharge.h"

#include "isdn/element/IsdnProperty.h"

#include <algorithm>
#include <iterator>
#include <new>

using Charge = IsdnCharge::Charge;
using Specific = Charge::Specific;

namespace
{
constexpr int NOT_TOLD = -1; // of a unit's number or type
constexpr int LARGEST = 16777215;

// The stack's enumerations count "not available" before the standard's first value.
constexpr int SHIFT = 1;

int IN_RANGE(long value) { return static_cast<int>(std::clamp(value, 0L, static_cast<long>(LARGEST))); }

void READ(pri_aoc_recorded_currency const& money, Q956::RecordedCurrency& currency)
{
    currency.m_rCurrency = IsdnProperty::STRING(money.currency);
    currency.m_rAmount.m_currencyAmount = IN_RANGE(money.amount.cost);
    currency.m_rAmount.m_multiplier = static_cast<Q956::EMultiplier::Type>(money.amount.multiplier);
}

void READ(pri_aoc_units_element const& element, Q956::RecordedUnits& units)
{
    auto& number = units.m_recordedNumber;
    if (element.number >= 0)
        number.select(number.m_recordedNumberOfUnits) = IN_RANGE(element.number);
    else
        number.select(number.m_notAvailable);
    if (element.type > 0)
        units.setPresent(units.m_recordedTypeOfUnits) = element.type;
}

void READ(pri_aoc_recorded_units const& recorded, AsnSequenceOf<Q956::RecordedUnits>& list)
{
    auto const count = static_cast<std::size_t>(std::max(recorded.num_items, 0));
    for (std::size_t i = 0; i < std::min(count, std::size(recorded.item)); ++i)
    {
        Q956::RecordedUnits* const units = list.append();
        if (units == nullptr)
            throw std::bad_alloc();
        READ(recorded.item[i], *units);
    }
}

/// AOC-D and AOC-E have the same members but for the last.
template <class Advice>
Charge CHARGE_OF(Advice const& advice, Q956::ETypeOfChargingInfo::Type type, int lastBillingId)
{
    Charge charge;
    if (advice.charge == PRI_AOC_DE_CHARGE_FREE)
        charge.select(charge.m_freeOfCharge);
    else if (advice.charge != PRI_AOC_DE_CHARGE_CURRENCY && advice.charge != PRI_AOC_DE_CHARGE_UNITS)
        charge.select(charge.m_chargeNotAvailable);
    else
    {
        Specific& specific = charge.select(charge.m_specific);
        specific.m_typeOfChargingInfo = type;
        if (advice.charge == PRI_AOC_DE_CHARGE_CURRENCY)
            READ(advice.recorded.money, specific.m_recorded.select(specific.m_recorded.m_currency));
        else
            READ(advice.recorded.unit, specific.m_recorded.select(specific.m_recorded.m_unitsList));
        if (advice.billing_id >= SHIFT && advice.billing_id <= lastBillingId)
            specific.setPresent(specific.m_billingId) =
                static_cast<Q956::EAOCEBillingId::Type>(advice.billing_id - SHIFT);
    }
    return charge;
}

template <std::size_t SIZE>
void WRITE(Q956::Currency const& currency, char (&array)[SIZE])
{
    array[currency.get().view().copy(array, SIZE - 1)] = '\0';
}

void WRITE(Q956::Amount const& amount, pri_aoc_amount& out)
{
    out.cost = IN_RANGE(static_cast<int>(amount.m_currencyAmount));
    Q956::EMultiplier::Type const multiplier = amount.m_multiplier;
    bool const isKnown = multiplier >= Q956::EMultiplier::ONE_THOUSANDTH && multiplier <= Q956::EMultiplier::THOUSAND;
    out.multiplier = isKnown ? static_cast<int>(multiplier) : static_cast<int>(PRI_AOC_MULTIPLIER_ONE);
}

void WRITE(AsnSequenceOf<Q956::RecordedUnits> const& list, pri_aoc_recorded_units& out)
{
    std::size_t const count = std::min(list.getSize(), std::size(out.item));
    for (std::size_t i = 0; i < count; ++i)
    {
        auto const& number = list[i].m_recordedNumber;
        bool const isKnown = number.isSelected(number.m_recordedNumberOfUnits);
        out.item[i].number = isKnown ? IN_RANGE(static_cast<int>(number.m_recordedNumberOfUnits)) : NOT_TOLD;
        bool const hasType = list[i].isPresent(list[i].m_recordedTypeOfUnits);
        out.item[i].type = hasType ? static_cast<int>(list[i].m_recordedTypeOfUnits) : NOT_TOLD;
    }
    out.num_items = static_cast<int>(count);
}

template <class Advice>
void WRITE(Charge const& charge, int lastBillingId, Advice& advice)
{
    advice.charge = PRI_AOC_DE_CHARGE_NOT_AVAILABLE;
    if (charge.isSelected(charge.m_freeOfCharge))
        advice.charge = PRI_AOC_DE_CHARGE_FREE;
    if (!charge.isSelected(charge.m_specific))
        return;
    Specific const& specific = charge.m_specific;
    auto const& recorded = specific.m_recorded;
    if (recorded.isSelected(recorded.m_currency))
    {
        advice.charge = PRI_AOC_DE_CHARGE_CURRENCY;
        WRITE(recorded.m_currency.m_rCurrency, advice.recorded.money.currency);
        WRITE(recorded.m_currency.m_rAmount, advice.recorded.money.amount);
    }
    else if (recorded.isSelected(recorded.m_unitsList))
    {
        advice.charge = PRI_AOC_DE_CHARGE_UNITS;
        WRITE(recorded.m_unitsList, advice.recorded.unit);
    }
    bool const hasBillingId = specific.isPresent(specific.m_billingId);
    int const billingId = hasBillingId ? static_cast<int>(specific.m_billingId) + SHIFT : 0;
    advice.billing_id = billingId <= lastBillingId ? std::max(billingId, 0) : 0;
}
} // namespace

Charge IsdnCharge::OF_D(pri_subcmd_aoc_d const& advice)
{
    bool const isTotal = advice.billing_accumulation == Q956::ETypeOfChargingInfo::TOTAL;
    return CHARGE_OF(advice, isTotal ? Q956::ETypeOfChargingInfo::TOTAL : Q956::ETypeOfChargingInfo::SUB_TOTAL,
                     PRI_AOC_D_BILLING_ID_CREDIT_CARD);
}

Charge IsdnCharge::OF_E(pri_subcmd_aoc_e const& advice)
{
    return CHARGE_OF(advice, Q956::ETypeOfChargingInfo::TOTAL, PRI_AOC_E_BILLING_ID_CALL_TRANSFER);
}

bool IsdnCharge::IS_TOTAL(Charge const& charge)
{
    return charge.isSelected(charge.m_specific) &&
           charge.m_specific.m_typeOfChargingInfo == Q956::ETypeOfChargingInfo::TOTAL;
}

pri_subcmd_aoc_d IsdnCharge::TO_D(Charge const& charge)
{
    pri_subcmd_aoc_d advice = {};
    WRITE(charge, PRI_AOC_D_BILLING_ID_CREDIT_CARD, advice);
    advice.billing_accumulation = IS_TOTAL(charge) ? 1 : 0;
    return advice;
}

pri_subcmd_aoc_e IsdnCharge::TO_E(Charge const& charge)
{
    pri_subcmd_aoc_e advice = {};
    WRITE(charge, PRI_AOC_E_BILLING_ID_CALL_TRANSFER, advice);
    return advice;
}

// --- AOC-S ---------------------------------------------------------------------------------------------------------

namespace
{
using Info = Q956::AOCSCurrencyInfo::Info;
using Tariff = IsdnCharge::Tariff;

struct ItemRow
{
    int wire;
    Q956::EChargedItem::Type item;
};
constexpr ItemRow ITEMS[] = {
    {PRI_AOC_CHARGED_ITEM_BASIC_COMMUNICATION, Q956::EChargedItem::BASIC_COMMUNICATION},
    {PRI_AOC_CHARGED_ITEM_CALL_ATTEMPT, Q956::EChargedItem::CALL_ATTEMPT},
    {PRI_AOC_CHARGED_ITEM_CALL_SETUP, Q956::EChargedItem::CALL_SETUP},
    {PRI_AOC_CHARGED_ITEM_USER_USER_INFO, Q956::EChargedItem::USER_TO_USER_INFO},
    {PRI_AOC_CHARGED_ITEM_SUPPLEMENTARY_SERVICE, Q956::EChargedItem::OPERATION_OF_SUPPLEMENTARY_SERV},
};

void READ(pri_aoc_amount const& from, Q956::Amount& amount)
{
    amount.m_currencyAmount = IN_RANGE(from.cost);
    amount.m_multiplier = static_cast<Q956::EMultiplier::Type>(from.multiplier);
}

void READ(pri_aoc_time const& from, Q956::Time& time)
{
    time.m_lengthOfTimeUnit = IN_RANGE(from.length);
    time.m_scale = static_cast<Q956::EScale::Type>(from.scale);
}

void READ(pri_aoc_duration const& from, Q956::DurationCurrency& duration)
{
    duration.m_dCurrency = IsdnProperty::STRING(from.currency);
    READ(from.amount, duration.m_dAmount);
    duration.m_dChargingType = static_cast<Q956::EChargingType::Type>(from.charging_type);
    READ(from.time, duration.m_dTime);
    if (from.granularity.length != 0)
        READ(from.granularity, duration.setPresent(duration.m_dGranularity));
}

void READ(pri_aoc_flat const& from, Q956::FlatRateCurrency& flat)
{
    flat.m_fRCurrency = IsdnProperty::STRING(from.currency);
    READ(from.amount, flat.m_fRAmount);
}

void READ(pri_aoc_volume const& from, Q956::VolumeRateCurrency& volume)
{
    volume.m_vRCurrency = IsdnProperty::STRING(from.currency);
    READ(from.amount, volume.m_vRAmount);
    volume.m_vRVolumeUnit = static_cast<Q956::EVolumeUnit::Type>(from.unit);
}

void READ(pri_aoc_s_element const& element, Info& info)
{
    auto const currency = [&]() -> Q956::AOCSCurrencyInfo::SpecificCurrency&
    { return info.select(info.m_specificCurrency); };
    switch (element.rate_type)
    {
    case PRI_AOC_RATE_TYPE_DURATION:
        READ(element.rate.duration, currency().select(info.m_specificCurrency.m_durationCurrency));
        break;
    case PRI_AOC_RATE_TYPE_FLAT:
        READ(element.rate.flat, currency().select(info.m_specificCurrency.m_flatRateCurrency));
        break;
    case PRI_AOC_RATE_TYPE_VOLUME:
        READ(element.rate.volume, currency().select(info.m_specificCurrency.m_volumeRateCurrency));
        break;
    case PRI_AOC_RATE_TYPE_SPECIAL_CODE:
        info.select(info.m_specialChargingCode) = element.rate.special;
        break;
    case PRI_AOC_RATE_TYPE_FREE:
    case PRI_AOC_RATE_TYPE_FREE_FROM_BEGINNING: // the property knows no difference
        info.select(info.m_freeOfCharge);
        break;
    default:
        info.select(info.m_currencyInfoNotAvailable);
    }
}

void WRITE(Q956::Time const& time, pri_aoc_time& out)
{
    out.length = IN_RANGE(static_cast<int>(time.m_lengthOfTimeUnit));
    out.scale = static_cast<int>(time.m_scale);
}

void WRITE(Q956::DurationCurrency const& duration, pri_aoc_duration& out)
{
    WRITE(duration.m_dCurrency, out.currency);
    WRITE(duration.m_dAmount, out.amount);
    WRITE(duration.m_dTime, out.time);
    out.charging_type = static_cast<int>(duration.m_dChargingType);
    if (duration.isPresent(duration.m_dGranularity))
        WRITE(duration.m_dGranularity, out.granularity);
}

void WRITE(Q956::AOCSCurrencyInfo::SpecificCurrency const& currency, pri_aoc_s_element& element)
{
    if (currency.isSelected(currency.m_durationCurrency))
    {
        element.rate_type = PRI_AOC_RATE_TYPE_DURATION;
        WRITE(currency.m_durationCurrency, element.rate.duration);
    }
    else if (currency.isSelected(currency.m_flatRateCurrency))
    {
        element.rate_type = PRI_AOC_RATE_TYPE_FLAT;
        WRITE(currency.m_flatRateCurrency.m_fRCurrency, element.rate.flat.currency);
        WRITE(currency.m_flatRateCurrency.m_fRAmount, element.rate.flat.amount);
    }
    else if (currency.isSelected(currency.m_volumeRateCurrency))
    {
        element.rate_type = PRI_AOC_RATE_TYPE_VOLUME;
        WRITE(currency.m_volumeRateCurrency.m_vRCurrency, element.rate.volume.currency);
        WRITE(currency.m_volumeRateCurrency.m_vRAmount, element.rate.volume.amount);
        element.rate.volume.unit = static_cast<int>(currency.m_volumeRateCurrency.m_vRVolumeUnit);
    }
}

void WRITE(Info const& info, pri_aoc_s_element& element)
{
    element.rate_type = PRI_AOC_RATE_TYPE_NOT_AVAILABLE;
    if (info.isSelected(info.m_specificCurrency))
        WRITE(info.m_specificCurrency, element);
    else if (info.isSelected(info.m_freeOfCharge))
        element.rate_type = PRI_AOC_RATE_TYPE_FREE;
    else if (info.isSelected(info.m_specialChargingCode))
    {
        element.rate_type = PRI_AOC_RATE_TYPE_SPECIAL_CODE;
        element.rate.special = static_cast<int>(info.m_specialChargingCode);
    }
}
} // namespace

Tariff IsdnCharge::OF_S(pri_subcmd_aoc_s const& advice)
{
    Tariff tariff;
    auto const count = std::min(static_cast<std::size_t>(std::max(advice.num_items, 0)), std::size(advice.item));
    if (count == 0)
        return tariff.select(tariff.m_chargeNotAvailable), tariff;
    if (advice.item[0].chargeable == PRI_AOC_CHARGED_ITEM_SPECIAL_ARRANGEMENT)
        return tariff.select(tariff.m_specialArrInfo) = advice.item[0].rate.special, tariff;
    auto& list = tariff.select(tariff.m_currencyInfoList);
    for (std::size_t i = 0; i < count; ++i)
    {
        auto const* const row = std::find_if(std::begin(ITEMS), std::end(ITEMS),
                                             [&](ItemRow const& one) { return one.wire == advice.item[i].chargeable; });
        if (row == std::end(ITEMS))
            continue;
        Q956::AOCSCurrencyInfo* const entry = list.append();
        if (entry == nullptr)
            throw std::bad_alloc();
        entry->m_chargedItem = row->item;
        READ(advice.item[i], entry->m_aOCSCurrencyInfo);
    }
    return tariff;
}

pri_subcmd_aoc_s IsdnCharge::TO_S(Tariff const& tariff)
{
    pri_subcmd_aoc_s advice = {};
    if (tariff.isSelected(tariff.m_specialArrInfo))
    {
        advice.num_items = 1;
        advice.item[0].chargeable = PRI_AOC_CHARGED_ITEM_SPECIAL_ARRANGEMENT;
        advice.item[0].rate_type = PRI_AOC_RATE_TYPE_SPECIAL_CODE;
        advice.item[0].rate.special = static_cast<int>(tariff.m_specialArrInfo);
    }
    if (!tariff.isSelected(tariff.m_currencyInfoList))
        return advice;
    for (Q956::AOCSCurrencyInfo const& entry : tariff.m_currencyInfoList)
    {
        auto const index = static_cast<std::size_t>(advice.num_items);
        auto const* const row = std::find_if(std::begin(ITEMS), std::end(ITEMS),
                                             [&](ItemRow const& one) { return one.item == entry.m_chargedItem; });
        if (row == std::end(ITEMS) || index == std::size(advice.item))
            continue;
        advice.item[index].chargeable = row->wire;
        WRITE(entry.m_aOCSCurrencyInfo, advice.item[index]);
        ++advice.num_items;
    }
    return advice;
}
