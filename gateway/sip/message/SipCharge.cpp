#include "sip/message/SipCharge.h"

#include "sip/message/SipAdvice.h"

#include <algorithm>
#include <iterator>
#include <new>

using Charge = SipCharge::Charge;
using namespace SipAdvice;

namespace
{
constexpr char const* UNITS = "UNIT";

// in the order of Q956::EAOCEBillingId
constexpr std::string_view BILLING_IDS[] = {
    "normal-charging", "reverse-charging", "credit-card", "cfu", "cfb", "cfnr", "cd", "ect"};

/// What aoc-d or aoc-e says, in which no name is used twice.
struct Told
{
    bool isFinal = false;
    bool hasCharge = false;
    bool isTotal = false;
    bool isFree = false;
    bool isNotAvailable = false;
    std::string currency;
    std::string amount;
    std::string billingId;

    static Told OF(std::vector<Element> const& elements)
    {
        Told told;
        for (Element const& element : elements)
        {
            bool const isFinal = element.path.size() > 1 && element.path[1] == "aoc-e";
            if (!isFinal && (element.path.size() < 2 || element.path[1] != "aoc-d"))
                continue;
            told.isFinal = told.isFinal || isFinal;
            told.hasCharge = told.hasCharge || element.getName() == "recorded-charges";
            told.isFree = told.isFree || element.getName() == "free-charge";
            told.isNotAvailable = told.isNotAvailable || element.getName() == "not-available";
            if (element.getName() == "currency-id")
                told.currency = element.text;
            else if (element.getName() == "currency-amount")
                told.amount = element.text;
            else if (element.getName() == "billing-id")
                told.billingId = element.text;
            else if (element.getName() == "charging-info")
                told.isTotal = element.text == "total";
        }
        return told;
    }
};

bool READ_RECORDED(Told const& told, Charge::Specific::Recorded& recorded)
{
    if (told.currency != UNITS)
    {
        auto& currency = recorded.select(recorded.m_currency);
        return READ_CURRENCY(told.currency, currency.m_rCurrency) && READ_AMOUNT(told.amount, currency.m_rAmount);
    }
    std::optional<int> const number = READ_UNITS(told.amount); // nobody charges half a unit
    Q956::RecordedUnits* const units = recorded.select(recorded.m_unitsList).append();
    if (units == nullptr)
        throw std::bad_alloc();
    units->m_recordedNumber.select(units->m_recordedNumber.m_recordedNumberOfUnits) = number.value_or(0);
    return number.has_value();
}

std::optional<Charge> CHARGE_OF(Told const& told)
{
    Charge charge;
    if (!told.hasCharge)
        return std::nullopt;
    if (told.isFree)
        return charge.select(charge.m_freeOfCharge), charge;
    if (told.isNotAvailable)
        return charge.select(charge.m_chargeNotAvailable), charge;
    Charge::Specific& specific = charge.select(charge.m_specific);
    specific.m_typeOfChargingInfo =
        told.isFinal || told.isTotal ? Q956::ETypeOfChargingInfo::TOTAL : Q956::ETypeOfChargingInfo::SUB_TOTAL;
    auto const* const id = std::find(std::begin(BILLING_IDS), std::end(BILLING_IDS), told.billingId);
    if (id != std::end(BILLING_IDS))
        specific.setPresent(specific.m_billingId) =
            static_cast<Q956::EAOCEBillingId::Type>(id - std::begin(BILLING_IDS));
    if (!READ_RECORDED(told, specific.m_recorded))
        return std::nullopt;
    return charge;
}

// --- writing ---------------------------------------------------------------------------------------------------------

/// In money or in units; empty: not known.
std::string RECORDED_TEXT(Charge::Specific::Recorded const& recorded)
{
    if (recorded.isSelected(recorded.m_currency))
        return PRICE_TEXT(recorded.m_currency.m_rCurrency, recorded.m_currency.m_rAmount);
    unsigned long long sum = 0;
    bool isKnown = false;
    if (recorded.isSelected(recorded.m_unitsList))
        for (Q956::RecordedUnits const& units : recorded.m_unitsList)
            if (auto const& number = units.m_recordedNumber; number.isSelected(number.m_recordedNumberOfUnits))
            {
                sum += static_cast<unsigned int>(static_cast<int>(number.m_recordedNumberOfUnits));
                isKnown = true;
            }
    return isKnown ? ELEMENT("currency-id", UNITS) + ELEMENT("currency-amount", std::to_string(sum)) : "";
}

std::string CHARGES_TEXT(Charge const& charge)
{
    if (charge.isSelected(charge.m_freeOfCharge))
        return "<free-charge/>";
    std::string const recorded =
        charge.isSelected(charge.m_specific) ? RECORDED_TEXT(charge.m_specific.m_recorded) : std::string();
    return recorded.empty() ? "<not-available/>" : ELEMENT("recorded-currency-units", recorded);
}

std::string BILLING_TEXT(Charge const& charge)
{
    if (!charge.isSelected(charge.m_specific) || !charge.m_specific.isPresent(charge.m_specific.m_billingId))
        return {};
    auto const id = static_cast<std::size_t>(static_cast<int>(charge.m_specific.m_billingId));
    return id < std::size(BILLING_IDS) ? ELEMENT("billing-id", std::string(BILLING_IDS[id])) : std::string();
}
} // namespace

std::optional<Charge> SipCharge::READ(std::string_view body) { return CHARGE_OF(Told::OF(SipAdvice::READ(body))); }

bool SipCharge::IS_TOTAL(Charge const& charge)
{
    return charge.isSelected(charge.m_specific) &&
           charge.m_specific.m_typeOfChargingInfo == Q956::ETypeOfChargingInfo::TOTAL;
}

std::string SipCharge::WRITE(Charge const& charge)
{
    bool const isTotal = IS_TOTAL(charge);
    std::string const charges = ELEMENT("recorded-charges", CHARGES_TEXT(charge)) + BILLING_TEXT(charge);
    return SipAdvice::WRITE(isTotal ? ELEMENT("aoc-e", charges)
                                    : ELEMENT("aoc-d", ELEMENT("charging-info", "subtotal") + charges));
}
