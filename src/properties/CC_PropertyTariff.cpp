#include "properties/CC_PropertyTariff.h"

CC_PropertyTariff::TypeId CC_PropertyTariff::s_typeId;

namespace
{
using Info = Q956::AOCSCurrencyInfo::Info;

int AMOUNT_OF(Q956::Amount const& amount) { return amount.m_currencyAmount; }

char const* MULTIPLIER_OF(Q956::Amount const& amount) { return Q956::EMultiplier::NAME(amount.m_multiplier); }

int LENGTH_OF(Q956::Time const& time) { return time.m_lengthOfTimeUnit; }

char const* SCALE_OF(Q956::Time const& time) { return Q956::EScale::NAME(time.m_scale); }

// currencies are appended whole, also behind a NUL, which "%s" would stop at

void APPEND(String& out, Q956::DurationCurrency const& rate)
{
    ((out += "Duration: ") += rate.m_dCurrency.get())
        .concatf(" %d * %s per %d %s", AMOUNT_OF(rate.m_dAmount), MULTIPLIER_OF(rate.m_dAmount),
                 LENGTH_OF(rate.m_dTime), SCALE_OF(rate.m_dTime));
    if (rate.isPresent(rate.m_dGranularity))
        out.concatf(" each %d %s", LENGTH_OF(rate.m_dGranularity), SCALE_OF(rate.m_dGranularity));
    out.concatf(" (%s)", Q956::EChargingType::NAME(rate.m_dChargingType));
}

void APPEND(String& out, Q956::FlatRateCurrency const& rate)
{
    ((out += "Flat Rate: ") += rate.m_fRCurrency.get())
        .concatf(" %d * %s", AMOUNT_OF(rate.m_fRAmount), MULTIPLIER_OF(rate.m_fRAmount));
}

// the multiplier stands behind "per": intended, operators' scripts read it there
void APPEND(String& out, Q956::VolumeRateCurrency const& rate)
{
    ((out += "Volume Rate: ") += rate.m_vRCurrency.get())
        .concatf(" %d per %s %s", AMOUNT_OF(rate.m_vRAmount), MULTIPLIER_OF(rate.m_vRAmount),
                 Q956::EVolumeUnit::NAME(rate.m_vRVolumeUnit));
}

void APPEND(String& out, Q956::AOCSCurrencyInfo::SpecificCurrency const& rate)
{
    if (rate.isSelected(rate.m_durationCurrency))
        APPEND(out, rate.m_durationCurrency);
    else if (rate.isSelected(rate.m_flatRateCurrency))
        APPEND(out, rate.m_flatRateCurrency);
    else if (rate.isSelected(rate.m_volumeRateCurrency))
        APPEND(out, rate.m_volumeRateCurrency);
}

void APPEND(String& out, Info const& info)
{
    if (info.isSelected(info.m_specificCurrency))
        APPEND(out, info.m_specificCurrency);
    else if (info.isSelected(info.m_specialChargingCode))
        out.concatf("Special: %d", static_cast<int>(info.m_specialChargingCode));
    else if (info.isSelected(info.m_freeOfCharge))
        out += "Free";
    else if (info.isSelected(info.m_currencyInfoNotAvailable))
        out += "N/A"; // an entry's form; the whole tariff's is "n/a", and the difference is intended
}
} // namespace

String& CC_PropertyTariff::getValueString(String& out) const
{
    out.clear();
    if (m_tariff.isSelected(m_tariff.m_chargeNotAvailable))
        return out = "n/a";
    if (m_tariff.isSelected(m_tariff.m_specialArrInfo))
        return out.format("Special Arrangement %d", static_cast<int>(m_tariff.m_specialArrInfo));
    if (!m_tariff.isSelected(m_tariff.m_currencyInfoList))
        return out;
    char const* separator = "";
    for (Q956::AOCSCurrencyInfo const& entry : m_tariff.m_currencyInfoList)
    {
        out.concatf("%s%s: ", separator, Q956::EChargedItem::NAME(entry.m_chargedItem));
        APPEND(out, entry.m_aOCSCurrencyInfo);
        separator = ", ";
    }
    return out;
}

void CC_PropertyTariff::Tariff::declareTariff()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Tariff::m_chargeNotAvailable>("chargeNotAvailable"),
        AsnField::OF<&Tariff::m_currencyInfoList>("currencyInfoList"),
        AsnField::OF<&Tariff::m_specialArrInfo>("specialArrInfo"),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}
