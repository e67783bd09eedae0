#include "platform/asn1/Q956_Enumerations.h"

namespace Q956
{
namespace
{
constexpr NamedValue<int> MULTIPLIERS[] = {
    {EMultiplier::ONE_THOUSANDTH, "oneThousandth"},
    {EMultiplier::ONE_HUNDREDTH, "oneHundredth"},
    {EMultiplier::ONE_TENTH, "oneTenth"},
    {EMultiplier::ONE, "one"},
    {EMultiplier::TEN, "ten"},
    {EMultiplier::HUNDRED, "hundred"},
    {EMultiplier::THOUSAND, "thousand"},
};
constexpr NamedValue<int> TYPES_OF_CHARGING_INFO[] = {
    {ETypeOfChargingInfo::SUB_TOTAL, "subTotal"},
    {ETypeOfChargingInfo::TOTAL, "total"},
};
constexpr NamedValue<int> AOCD_BILLING_IDS[] = {
    {EAOCDBillingId::NORMAL_CHARGING, "normalCharging"},
    {EAOCDBillingId::REVERSE_CHARGING, "reverseCharging"},
    {EAOCDBillingId::CREDIT_CARD_CHARGING, "creditCardCharging"},
};
constexpr NamedValue<int> AOCE_BILLING_IDS[] = {
    {EAOCEBillingId::NORMAL_CHARGING, "normalCharging"},
    {EAOCEBillingId::REVERSE_CHARGING, "reverseCharging"},
    {EAOCEBillingId::CREDIT_CARD_CHARGING, "creditCardCharging"},
    {EAOCEBillingId::CALL_FORWARDING_UNCONDITIONAL, "callForwardingUnconditional"},
    {EAOCEBillingId::CALL_FORWARDING_BUSY, "callForwardingBusy"},
    {EAOCEBillingId::CALL_FORWARDING_NO_REPLY, "callForwardingNoReply"},
    {EAOCEBillingId::CALL_DEFLECTION, "callDeflection"},
    {EAOCEBillingId::CALL_TRANSFER, "callTransfer"},
};
constexpr NamedValue<int> CHARGED_ITEMS[] = {
    {EChargedItem::BASIC_COMMUNICATION, "basicCommunication"},
    {EChargedItem::CALL_ATTEMPT, "callAttempt"},
    {EChargedItem::CALL_SETUP, "callSetup"},
    {EChargedItem::USER_TO_USER_INFO, "userToUserInfo"},
    {EChargedItem::OPERATION_OF_SUPPLEMENTARY_SERV, "operationOfSupplementaryServ"},
};
constexpr NamedValue<int> CHARGING_TYPES[] = {
    {EChargingType::CONTINUOUS_CHARGING, "continuousCharging"},
    {EChargingType::STEP_FUNCTION, "stepFunction"},
};
constexpr NamedValue<int> SCALES[] = {
    {EScale::ONE_HUNDREDTH_SECOND, "oneHundredthSecond"},
    {EScale::ONE_TENTH_SECOND, "oneTenthSecond"},
    {EScale::ONE_SECOND, "oneSecond"},
    {EScale::TEN_SECONDS, "tenSeconds"},
    {EScale::ONE_MINUTE, "oneMinute"},
    {EScale::ONE_HOUR, "oneHour"},
    {EScale::TWENTY_FOUR_HOURS, "twentyFourHours"},
};
constexpr NamedValue<int> VOLUME_UNITS[] = {
    {EVolumeUnit::OCTET, "octet"},
    {EVolumeUnit::SEGMENT, "segment"},
    {EVolumeUnit::MESSAGE, "message"},
};
} // namespace

AsnEnumeratedPrimitive::Identifiers EMultiplier::IDENTIFIERS() { return MULTIPLIERS; }
char const* EMultiplier::NAME(Type value) { return NAME_OF(MULTIPLIERS, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers ETypeOfChargingInfo::IDENTIFIERS() { return TYPES_OF_CHARGING_INFO; }
char const* ETypeOfChargingInfo::NAME(Type value) { return NAME_OF(TYPES_OF_CHARGING_INFO, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers EAOCDBillingId::IDENTIFIERS() { return AOCD_BILLING_IDS; }
char const* EAOCDBillingId::NAME(Type value) { return NAME_OF(AOCD_BILLING_IDS, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers EAOCEBillingId::IDENTIFIERS() { return AOCE_BILLING_IDS; }
char const* EAOCEBillingId::NAME(Type value) { return NAME_OF(AOCE_BILLING_IDS, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers EChargedItem::IDENTIFIERS() { return CHARGED_ITEMS; }
char const* EChargedItem::NAME(Type value) { return NAME_OF(CHARGED_ITEMS, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers EChargingType::IDENTIFIERS() { return CHARGING_TYPES; }
char const* EChargingType::NAME(Type value) { return NAME_OF(CHARGING_TYPES, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers EScale::IDENTIFIERS() { return SCALES; }
char const* EScale::NAME(Type value) { return NAME_OF(SCALES, static_cast<int>(value)); }

AsnEnumeratedPrimitive::Identifiers EVolumeUnit::IDENTIFIERS() { return VOLUME_UNITS; }
char const* EVolumeUnit::NAME(Type value) { return NAME_OF(VOLUME_UNITS, static_cast<int>(value)); }
} // namespace Q956
