#include "platform/asn1/Q956.h"

namespace Q956
{
void Amount::declareAmount()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Amount::m_currencyAmount>("currencyAmount", AsnImplicit(1)),
        AsnField::OF<&Amount::m_multiplier>("multiplier", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void RecordedCurrency::declareRecordedCurrency()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&RecordedCurrency::m_rCurrency>("rCurrency", AsnImplicit(1)),
        AsnField::OF<&RecordedCurrency::m_rAmount>("rAmount", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void RecordedUnits::RecordedNumber::declareRecordedNumber()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&RecordedNumber::m_recordedNumberOfUnits>("recordedNumberOfUnits"),
        AsnField::OF<&RecordedNumber::m_notAvailable>("notAvailable"),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void RecordedUnits::declareRecordedUnits()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&RecordedUnits::m_recordedNumber>("recordedNumber"),
        AsnField::OF<&RecordedUnits::m_recordedTypeOfUnits>("recordedTypeOfUnits", AsnOptional()),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void Time::declareTime()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Time::m_lengthOfTimeUnit>("lengthOfTimeUnit", AsnImplicit(1)),
        AsnField::OF<&Time::m_scale>("scale", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void DurationCurrency::declareDurationCurrency()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&DurationCurrency::m_dCurrency>("dCurrency", AsnImplicit(1)),
        AsnField::OF<&DurationCurrency::m_dAmount>("dAmount", AsnImplicit(2)),
        AsnField::OF<&DurationCurrency::m_dChargingType>("dChargingType", AsnImplicit(3)),
        AsnField::OF<&DurationCurrency::m_dTime>("dTime", AsnImplicit(4)),
        AsnField::OF<&DurationCurrency::m_dGranularity>("dGranularity", AsnImplicit(5), AsnOptional()),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void FlatRateCurrency::declareFlatRateCurrency()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&FlatRateCurrency::m_fRCurrency>("fRCurrency", AsnImplicit(1)),
        AsnField::OF<&FlatRateCurrency::m_fRAmount>("fRAmount", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void VolumeRateCurrency::declareVolumeRateCurrency()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&VolumeRateCurrency::m_vRCurrency>("vRCurrency", AsnImplicit(1)),
        AsnField::OF<&VolumeRateCurrency::m_vRAmount>("vRAmount", AsnImplicit(2)),
        AsnField::OF<&VolumeRateCurrency::m_vRVolumeUnit>("vRVolumeUnit", AsnImplicit(3)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void AOCSCurrencyInfo::SpecificCurrency::declareSpecificCurrency()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&SpecificCurrency::m_durationCurrency>("durationCurrency", AsnImplicit(1)),
        AsnField::OF<&SpecificCurrency::m_flatRateCurrency>("flatRateCurrency", AsnImplicit(2)),
        AsnField::OF<&SpecificCurrency::m_volumeRateCurrency>("volumeRateCurrency", AsnImplicit(3)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void AOCSCurrencyInfo::Info::declareInfo()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Info::m_specificCurrency>("specificCurrency"),
        AsnField::OF<&Info::m_specialChargingCode>("specialChargingCode"),
        AsnField::OF<&Info::m_freeOfCharge>("freeOfCharge", AsnImplicit(4)),
        AsnField::OF<&Info::m_currencyInfoNotAvailable>("currencyInfoNotAvailable", AsnImplicit(5)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void AOCSCurrencyInfo::declareAOCSCurrencyInfo()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&AOCSCurrencyInfo::m_chargedItem>("chargedItem"),
        AsnField::OF<&AOCSCurrencyInfo::m_aOCSCurrencyInfo>("aOCSCurrencyInfo"),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}
} // namespace Q956
