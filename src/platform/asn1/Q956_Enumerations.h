#pragma once

#include "platform/asn1/AsnEnumerated.h"

/// The enumerations of the advice-of-charge services (ITU-T Q.956.2, EN 300 182-1). Any integer is a value: a number
/// that the standard does not assign travels unchanged and has the name ERROR::INVALID. The names are the standard's
/// identifiers.
///
///     std::puts(Q956::EMultiplier::NAME(Q956::EMultiplier::ONE_TENTH)); // oneTenth
namespace Q956
{
/// By what an amount is to be multiplied.
struct CC_EXPORT EMultiplier
{
    /// Numbered as in the standard.
    enum Type : int
    {
        ONE_THOUSANDTH = 0,
        ONE_HUNDREDTH = 1,
        ONE_TENTH = 2,
        ONE = 3,
        TEN = 4,
        HUNDRED = 5,
        THOUSAND = 6
    };
    static constexpr char const* TYPE_NAME = "Multiplier";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// Whether a charge is the final one.
struct CC_EXPORT ETypeOfChargingInfo
{
    /// Numbered as in the standard.
    enum Type : int
    {
        SUB_TOTAL = 0, ///< so far, during the call
        TOTAL = 1      ///< at its end
    };
    static constexpr char const* TYPE_NAME = "TypeOfChargingInfo";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// Why these charges arise, during the call. The first numbers of EAOCEBillingId are the same.
struct CC_EXPORT EAOCDBillingId
{
    /// Numbered as in the standard.
    enum Type : int
    {
        NORMAL_CHARGING = 0,
        REVERSE_CHARGING = 1,
        CREDIT_CARD_CHARGING = 2
    };
    static constexpr char const* TYPE_NAME = "AOCDBillingId";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// Why these charges arise, at the end of the call.
struct CC_EXPORT EAOCEBillingId
{
    /// Numbered as in the standard.
    enum Type : int
    {
        NORMAL_CHARGING = 0,
        REVERSE_CHARGING = 1,
        CREDIT_CARD_CHARGING = 2,
        CALL_FORWARDING_UNCONDITIONAL = 3,
        CALL_FORWARDING_BUSY = 4,
        CALL_FORWARDING_NO_REPLY = 5,
        CALL_DEFLECTION = 6,
        CALL_TRANSFER = 7
    };
    static constexpr char const* TYPE_NAME = "AOCEBillingId";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// What is charged for.
struct CC_EXPORT EChargedItem
{
    /// Numbered as in the standard.
    enum Type : int
    {
        BASIC_COMMUNICATION = 0,
        CALL_ATTEMPT = 1,
        CALL_SETUP = 2,
        USER_TO_USER_INFO = 3,
        OPERATION_OF_SUPPLEMENTARY_SERV = 4
    };
    static constexpr char const* TYPE_NAME = "ChargedItem";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// Whether the charge grows steadily or in steps.
struct CC_EXPORT EChargingType
{
    /// Numbered as in the standard.
    enum Type : int
    {
        CONTINUOUS_CHARGING = 0,
        STEP_FUNCTION = 1
    };
    static constexpr char const* TYPE_NAME = "ChargingType";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// The unit of a length of time.
struct CC_EXPORT EScale
{
    /// Numbered as in the standard.
    enum Type : int
    {
        ONE_HUNDREDTH_SECOND = 0,
        ONE_TENTH_SECOND = 1,
        ONE_SECOND = 2,
        TEN_SECONDS = 3,
        ONE_MINUTE = 4,
        ONE_HOUR = 5,
        TWENTY_FOUR_HOURS = 6
    };
    static constexpr char const* TYPE_NAME = "Scale";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};

/// The unit of a volume of data.
struct CC_EXPORT EVolumeUnit
{
    /// Numbered as in the standard.
    enum Type : int
    {
        OCTET = 0,
        SEGMENT = 1,
        MESSAGE = 2
    };
    static constexpr char const* TYPE_NAME = "VolumeUnit";
    static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS();
    static char const* NAME(Type value);
};
} // namespace Q956
