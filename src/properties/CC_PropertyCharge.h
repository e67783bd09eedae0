#pragma once

#include "platform/asn1/Q956.h"
#include "properties/CC_PropertyClass.h"

/// What a call has cost so far or in all, as the advice-of-charge services tell it during the call (AOC-D) and at its
/// end (AOC-E). Text: "N/A", "Free" or a specific charge such as "EUR 12.34 (normalCharging) (total)"; empty as long as
/// nothing is selected. Not settable by text.
///
///     CC_PropertyCharge::Charge charge;
///     auto& specific = charge.select(charge.m_specific);
///     specific.m_typeOfChargingInfo = Q956::ETypeOfChargingInfo::TOTAL;
///     auto& currency = specific.m_recorded.select(specific.m_recorded.m_currency);
///     currency.m_rCurrency = "EUR";
///     currency.m_rAmount.m_currencyAmount = 1234;
///     currency.m_rAmount.m_multiplier = Q956::EMultiplier::ONE_HUNDREDTH;
///     adapter.setOwnProperty(CC_PropertyCharge(CC_PropertyId::CHARGE, charge));
class CC_EXPORT CC_PropertyCharge : public CC_PropertyClass<CC_PropertyCharge>
{
public:
    /// The record: exactly one of its members is selected.
    class CC_EXPORT Charge : public AsnClass<Charge, ASN_CHOICE>
    {
    public:
        /// An amount, and what it stands for.
        class CC_EXPORT Specific : public AsnClass<Specific, AsnSequence>
        {
        public:
            /// Money or units. On the wire the two bear tags of their own, since both are sequences.
            class CC_EXPORT Recorded : public AsnClass<Recorded, ASN_CHOICE>
            {
            public:
                static constexpr char const* TYPE_NAME = "ChargeRecorded";
                Recorded() { declareRecorded(); }

                /// In money, or in units of one type or several. @{
                Q956::RecordedCurrency m_currency;
                AsnSequenceOf<Q956::RecordedUnits> m_unitsList;
                /// @}

            private:
                void declareRecorded();
            };

            static constexpr char const* TYPE_NAME = "ChargeSpecific";
            Specific() { declareSpecific(); }

            /// The amount, and whether it is final. @{
            Recorded m_recorded;
            AsnEnumerated<Q956::ETypeOfChargingInfo> m_typeOfChargingInfo;
            /// @}
            AsnEnumerated<Q956::EAOCEBillingId> m_billingId; ///< optional

        private:
            void declareSpecific();
        };

        static constexpr char const* TYPE_NAME = "Charge";
        Charge() { declareCharge(); }

        /// Not known, nothing to pay, or an amount. @{
        AsnPrimitiveDerivedWithTag<AsnNullWrapper, AsnTag::UNIVERSAL, AsnTag::NULL_TYPE> m_chargeNotAvailable;
        AsnPrimitiveDerivedWithTag<AsnNullWrapper, AsnTag::UNIVERSAL, AsnTag::NULL_TYPE> m_freeOfCharge;
        Specific m_specific;
        /// @}

    private:
        void declareCharge();
    };

    static constexpr char const* TYPE_NAME = "Charge";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< nothing selected, unless a charge is given
    CC_PropertyCharge(unsigned int id, Charge const& charge) : CC_PropertyClass(id), m_charge(charge) {}

    /// Setting copies the record: std::bad_alloc when memory is out. @{
    Charge const& getValue() const { return m_charge; }
    void setValue(Charge const& charge) { m_charge = charge; }
    /// @}
    bool hasSameValue(CC_PropertyCharge const& other) const { return m_charge == other.m_charge; }
    String& getValueString(String& out) const override;

private:
    Charge m_charge;
};
