#pragma once

#include "platform/asn1/Q956.h"
#include "properties/CC_PropertyClass.h"

/// What a call will be charged at, as the advice-of-charge service tells it at call set-up (AOC-S). Text: "n/a", the
/// rates of the charged items joined by ", ", or "Special Arrangement 3"; empty as long as nothing is selected. Not
/// settable by text.
///
///     CC_PropertyTariff::Tariff tariff;
///     Q956::AOCSCurrencyInfo* const entry = tariff.select(tariff.m_currencyInfoList).append();
///     if (entry == nullptr)
///         return XCode::NO_ELEMENT;
///     entry->m_chargedItem = Q956::EChargedItem::CALL_SETUP;
///     entry->m_aOCSCurrencyInfo.select(entry->m_aOCSCurrencyInfo.m_freeOfCharge);
///     adapter.setOwnProperty(CC_PropertyTariff(CC_PropertyId::TARIFF, tariff)); // "callSetup: Free"
class CC_EXPORT CC_PropertyTariff : public CC_PropertyClass<CC_PropertyTariff>
{
public:
    /// The record: exactly one of its members is selected.
    class CC_EXPORT Tariff : public AsnClass<Tariff, ASN_CHOICE>
    {
    public:
        static constexpr char const* TYPE_NAME = "Tariff";
        Tariff() { declareTariff(); }

        /// Not known, the rates of the charged items, or an arrangement that the users know by number. @{
        AsnPrimitive m_chargeNotAvailable{AsnTag::UNIVERSAL, AsnTag::NULL_TYPE};
        AsnSequenceOf<Q956::AOCSCurrencyInfo> m_currencyInfoList;
        AsnPrimitiveNativeWithTag<int, AsnTag::UNIVERSAL, AsnTag::INTEGER> m_specialArrInfo;
        /// @}

    private:
        void declareTariff();
    };

    static constexpr char const* TYPE_NAME = "Tariff";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< nothing selected, unless a tariff is given
    CC_PropertyTariff(unsigned int id, Tariff const& tariff) : CC_PropertyClass(id), m_tariff(tariff) {}

    /// Setting copies the record: std::bad_alloc when memory is out. @{
    Tariff const& getValue() const { return m_tariff; }
    void setValue(Tariff const& tariff) { m_tariff = tariff; }
    /// @}
    bool hasSameValue(CC_PropertyTariff const& other) const { return m_tariff == other.m_tariff; }
    String& getValueString(String& out) const override;

private:
    Tariff m_tariff;
};
