#include "properties/CC_PropertyCharge.h"

CC_PropertyCharge::TypeId CC_PropertyCharge::s_typeId;

namespace
{
using Specific = CC_PropertyCharge::Charge::Specific;

/// How an amount becomes a whole part and a fraction.
struct Scaling
{
    int factor;
    int divisor;
    int decimalPlaces;
};

constexpr Scaling UNSCALED = {1, 1, 0};
// by the number of the multiplier
constexpr Scaling SCALINGS[] = {{1, 1000, 3}, {1, 100, 2}, {1, 10, 1}, UNSCALED, {10, 1, 0}, {100, 1, 0}, {1000, 1, 0}};

Scaling const& SCALING_OF(Q956::EMultiplier::Type multiplier)
{
    bool const isKnown = multiplier >= Q956::EMultiplier::ONE_THOUSANDTH && multiplier <= Q956::EMultiplier::THOUSAND;
    return isKnown ? SCALINGS[multiplier] : UNSCALED;
}

void APPEND_CURRENCY(String& out, Q956::RecordedCurrency const& currency)
{
    Scaling const& scaling = SCALING_OF(currency.m_rAmount.m_multiplier);
    int const amount = currency.m_rAmount.m_currencyAmount;
    // the record's numbers have 32 bits: a product that needs more loses its upper ones, as readers of it expect
    int const scaled = static_cast<int>(static_cast<long long>(amount) * scaling.factor);
    out += currency.m_rCurrency.get(); // whole, also behind a NUL
    out.concatf(" %d", scaled / scaling.divisor);
    if (scaling.decimalPlaces != 0)
        out.concatf(".%*.*d", scaling.decimalPlaces, scaling.decimalPlaces, scaled % scaling.divisor);
}

void APPEND_UNITS(String& out, Q956::RecordedUnits const& units)
{
    Q956::RecordedUnits::RecordedNumber const& number = units.m_recordedNumber;
    if (number.isSelected(number.m_recordedNumberOfUnits))
        out.concatf("%d units", static_cast<int>(number.m_recordedNumberOfUnits));
    else
        out += "N/A";
    if (units.isPresent(units.m_recordedTypeOfUnits))
        out.concatf(" of type %d", static_cast<int>(units.m_recordedTypeOfUnits));
}

void APPEND_RECORDED(String& out, Specific::Recorded const& recorded)
{
    if (recorded.isSelected(recorded.m_currency))
        return APPEND_CURRENCY(out, recorded.m_currency);
    if (!recorded.isSelected(recorded.m_unitsList))
        return;
    char const* separator = "";
    for (Q956::RecordedUnits const& units : recorded.m_unitsList)
    {
        out += separator;
        APPEND_UNITS(out, units);
        separator = ", ";
    }
}

void APPEND_SPECIFIC(String& out, Specific const& specific)
{
    APPEND_RECORDED(out, specific.m_recorded);
    if (specific.isPresent(specific.m_billingId))
        out.concatf(" (%s)", Q956::EAOCEBillingId::NAME(specific.m_billingId));
    out.concatf(" (%s)", Q956::ETypeOfChargingInfo::NAME(specific.m_typeOfChargingInfo));
}
} // namespace

String& CC_PropertyCharge::getValueString(String& out) const
{
    out.clear();
    if (m_charge.isSelected(m_charge.m_chargeNotAvailable))
        out = "N/A";
    else if (m_charge.isSelected(m_charge.m_freeOfCharge))
        out = "Free";
    else if (m_charge.isSelected(m_charge.m_specific))
        APPEND_SPECIFIC(out, m_charge.m_specific);
    return out;
}

void CC_PropertyCharge::Charge::Specific::Recorded::declareRecorded()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Recorded::m_currency>("currency", AsnImplicit(1)),
        AsnField::OF<&Recorded::m_unitsList>("unitsList", AsnImplicit(2)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_PropertyCharge::Charge::Specific::declareSpecific()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Specific::m_recorded>("recorded", AsnImplicit(1)),
        AsnField::OF<&Specific::m_typeOfChargingInfo>("typeOfChargingInfo", AsnImplicit(2)),
        AsnField::OF<&Specific::m_billingId>("billingId", AsnImplicit(3), AsnOptional()),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}

void CC_PropertyCharge::Charge::declareCharge()
{
    static constexpr AsnField FIELDS[] = {
        AsnField::OF<&Charge::m_chargeNotAvailable>("chargeNotAvailable", AsnImplicit(1)),
        AsnField::OF<&Charge::m_freeOfCharge>("freeOfCharge", AsnImplicit(2)),
        AsnField::OF<&Charge::m_specific>("specific", AsnImplicit(3)),
    };
    static_assert(AsnField::ARE_DISTINCT(FIELDS));
    declare(FIELDS);
}
