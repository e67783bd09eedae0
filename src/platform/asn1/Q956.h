#pragma once

#include "platform/asn1/ASN_CHOICE.h"
#include "platform/asn1/AsnSequence.h"
#include "platform/asn1/AsnSequenceOf.h"
#include "platform/asn1/Q956_Enumerations.h"

/// The types of the advice-of-charge services (ITU-T Q.956.2, EN 300 182-1), as the standard's module defines them.
/// Ranges and sizes are the standard's and printed in the notation; the codec does not check them.
///
///     Q956::RecordedCurrency charge;
///     charge.m_rCurrency = "EUR";
///     charge.m_rAmount.m_currencyAmount = 1234;
///     charge.m_rAmount.m_multiplier = Q956::EMultiplier::ONE_HUNDREDTH; // 12.34
namespace Q956
{
/// The name of a currency, such as "EUR".
class CC_EXPORT Currency : public AsnClass<Currency, AsnIA5String>
{
public:
    static constexpr char const* TYPE_NAME = "Currency";
    static constexpr char const* CONSTRAINT = "(SIZE (1..10))";
    using AsnIA5String::operator=;
};

/// An amount of money, in units of a multiplier.
class CC_EXPORT CurrencyAmount : public AsnClass<CurrencyAmount, AsnInteger>
{
public:
    static constexpr char const* TYPE_NAME = "CurrencyAmount";
    static constexpr char const* CONSTRAINT = "(0..16777215)";
    using AsnInteger::operator=;
};

/// How many charging units.
class CC_EXPORT NumberOfUnits : public AsnClass<NumberOfUnits, AsnInteger>
{
public:
    static constexpr char const* TYPE_NAME = "NumberOfUnits";
    static constexpr char const* CONSTRAINT = "(0..16777215)";
    using AsnInteger::operator=;
};

/// The kind of charging unit, as the network numbers them.
class CC_EXPORT TypeOfUnit : public AsnClass<TypeOfUnit, AsnInteger>
{
public:
    static constexpr char const* TYPE_NAME = "TypeOfUnit";
    static constexpr char const* CONSTRAINT = "(1..16)";
    using AsnInteger::operator=;
};

/// A length of time, in units of a scale.
class CC_EXPORT LengthOfTimeUnit : public AsnClass<LengthOfTimeUnit, AsnInteger>
{
public:
    static constexpr char const* TYPE_NAME = "LengthOfTimeUnit";
    static constexpr char const* CONSTRAINT = "(0..16777215)";
    using AsnInteger::operator=;
};

/// A charge that the network and its users know by number.
class CC_EXPORT SpecialChargingCode : public AsnClass<SpecialChargingCode, AsnInteger>
{
public:
    static constexpr char const* TYPE_NAME = "SpecialChargingCode";
    static constexpr char const* CONSTRAINT = "(1..10)";
    using AsnInteger::operator=;
};

/// An amount of money: a whole number of thousandths, hundredths ... thousands.
class CC_EXPORT Amount : public AsnClass<Amount, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "Amount";
    Amount() { declareAmount(); }

    /// The number times the multiplier: 1234 and ONE_HUNDREDTH are 12.34. @{
    CurrencyAmount m_currencyAmount;
    AsnEnumerated<EMultiplier> m_multiplier;
    /// @}

private:
    void declareAmount();
};

/// A charge in money.
class CC_EXPORT RecordedCurrency : public AsnClass<RecordedCurrency, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "RecordedCurrency";
    RecordedCurrency() { declareRecordedCurrency(); }

    /// The currency, and how much of it. @{
    Currency m_rCurrency;
    Amount m_rAmount;
    /// @}

private:
    void declareRecordedCurrency();
};

/// A charge in units of one type.
class CC_EXPORT RecordedUnits : public AsnClass<RecordedUnits, AsnSequence>
{
public:
    /// The units, if their number is known: exactly one of its members is selected.
    class CC_EXPORT RecordedNumber : public AsnClass<RecordedNumber, ASN_CHOICE>
    {
    public:
        RecordedNumber() { declareRecordedNumber(); }

        /// The number, or that the network does not know it. @{
        NumberOfUnits m_recordedNumberOfUnits;
        AsnNull m_notAvailable;
        /// @}

    private:
        void declareRecordedNumber();
    };

    static constexpr char const* TYPE_NAME = "RecordedUnits";
    RecordedUnits() { declareRecordedUnits(); }

    /// How many units; of which type may be told as well.
    RecordedNumber m_recordedNumber;
    TypeOfUnit m_recordedTypeOfUnits; ///< optional

private:
    void declareRecordedUnits();
};

/// The standard's list of units; the charge record's own list has no size.
class CC_EXPORT RecordedUnitsList : public AsnClass<RecordedUnitsList, AsnSequenceOf<RecordedUnits>>
{
public:
    static constexpr char const* TYPE_NAME = "RecordedUnitsList";
    static constexpr char const* CONSTRAINT = "SIZE (1..32)";
};

/// A span of time: a number of hundredths of a second ... days.
class CC_EXPORT Time : public AsnClass<Time, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "Time";
    Time() { declareTime(); }

    /// The number times the scale: 90 and ONE_SECOND are a minute and a half. @{
    LengthOfTimeUnit m_lengthOfTimeUnit;
    AsnEnumerated<EScale> m_scale;
    /// @}

private:
    void declareTime();
};

/// So much money for each span of time.
class CC_EXPORT DurationCurrency : public AsnClass<DurationCurrency, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "DurationCurrency";
    DurationCurrency() { declareDurationCurrency(); }

    /// So much of the currency for each `m_dTime`, which grows steadily or in steps. @{
    Currency m_dCurrency;
    Amount m_dAmount;
    AsnEnumerated<EChargingType> m_dChargingType;
    Time m_dTime;
    /// @}
    Time m_dGranularity; ///< optional

private:
    void declareDurationCurrency();
};

/// So much money once.
class CC_EXPORT FlatRateCurrency : public AsnClass<FlatRateCurrency, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "FlatRateCurrency";
    FlatRateCurrency() { declareFlatRateCurrency(); }

    /// The currency, and how much of it is charged once. @{
    Currency m_fRCurrency;
    Amount m_fRAmount;
    /// @}

private:
    void declareFlatRateCurrency();
};

/// So much money for each unit of volume.
class CC_EXPORT VolumeRateCurrency : public AsnClass<VolumeRateCurrency, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "VolumeRateCurrency";
    VolumeRateCurrency() { declareVolumeRateCurrency(); }

    /// So much of the currency for each unit of volume. @{
    Currency m_vRCurrency;
    Amount m_vRAmount;
    AsnEnumerated<EVolumeUnit> m_vRVolumeUnit;
    /// @}

private:
    void declareVolumeRateCurrency();
};

/// What one item is charged at, told at call set-up.
class CC_EXPORT AOCSCurrencyInfo : public AsnClass<AOCSCurrencyInfo, AsnSequence>
{
public:
    /// How the item is charged in money: exactly one of its members is selected.
    class CC_EXPORT SpecificCurrency : public AsnClass<SpecificCurrency, ASN_CHOICE>
    {
    public:
        SpecificCurrency() { declareSpecificCurrency(); }

        /// By time, once, or by volume. @{
        DurationCurrency m_durationCurrency;
        FlatRateCurrency m_flatRateCurrency;
        VolumeRateCurrency m_volumeRateCurrency;
        /// @}

    private:
        void declareSpecificCurrency();
    };

    /// What is said about one charged item: exactly one of its members is selected.
    class CC_EXPORT Info : public AsnClass<Info, ASN_CHOICE>
    {
    public:
        Info() { declareInfo(); }

        /// In money, by a number that the users know, for nothing, or not known. @{
        SpecificCurrency m_specificCurrency;
        SpecialChargingCode m_specialChargingCode;
        AsnNull m_freeOfCharge;
        AsnNull m_currencyInfoNotAvailable;
        /// @}

    private:
        void declareInfo();
    };

    static constexpr char const* TYPE_NAME = "AOCSCurrencyInfo";
    AOCSCurrencyInfo() { declareAOCSCurrencyInfo(); }

    /// The item, and what is said about it. @{
    AsnEnumerated<EChargedItem> m_chargedItem;
    Info m_aOCSCurrencyInfo;
    /// @}

private:
    void declareAOCSCurrencyInfo();
};
} // namespace Q956
