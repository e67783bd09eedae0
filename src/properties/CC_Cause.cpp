#include "properties/CC_Cause.h"

#include "platform/base/NameOf.h"

#include <cstddef>
#include <iterator>

namespace
{
constexpr char const* UNSPECIFIED_NAME = "(unspecified)";
constexpr char const* NO_NAME = "";

constexpr NamedValue<QCause> CAUSES[] = {
    {QCause::NONE, "no-error"},
    {QCause::UNALLOCATED_NUMBER, "unallocated-number"},
    {QCause::NO_ROUTE_TO_TRANSIT_NETWORK, "no-route-to-network"},
    {QCause::NO_ROUTE_TO_DESTINATION, "no-route-to-destination"},
    {QCause::CHANNEL_UNACCEPTABLE, "channel-unacceptable"},
    {QCause::CALL_AWARDED_IN_ESTABLISHED_CHANNEL, "call-awarded"},
    {QCause::NORMAL_CALL_CLEARING, "normal-call-clearing"},
    {QCause::USER_BUSY, "user-busy"},
    {QCause::NO_USER_RESPONDING, "no-user-responding"},
    {QCause::NO_ANSWER_FROM_USER, "no-answer-from-user"},
    {QCause::SUBSCRIBER_ABSENT, "subscriber-absent"},
    {QCause::CALL_REJECTED, "call-rejected"},
    {QCause::NUMBER_CHANGED, "number-changed"},
    {QCause::NON_SELECTED_USER_CLEARING, "non-selected-user-clearing"},
    {QCause::DESTINATION_OUT_OF_ORDER, "destination-out-of-order"},
    {QCause::INVALID_NUMBER_FORMAT, "invalid-number-format"},
    {QCause::FACILITY_REJECTED, "facility-rejected"},
    {QCause::RESPONSE_TO_STATUS_ENQUIRY, "response-to-status-enquiry"},
    {QCause::NORMAL_UNSPECIFIED, "normal-unspecified"},
    {QCause::NO_CIRCUIT_CHANNEL_AVAILABLE, "no-circuit-channel-available"},
    {QCause::NETWORK_OUT_OF_ORDER, "network-out-of-order"},
    {QCause::TEMPORARY_FAILURE, "temporary-failure"},
    {QCause::SWITCHING_EQUIPMENT_CONGESTION, "switching-equipment-congestion"},
    {QCause::ACCESS_INFORMATION_DISCARDED, "access-info-discarded"},
    {QCause::REQUESTED_CIRCUIT_CHANNEL_NOT_AVAILABLE, "circuit-channel-not-available"},
    {QCause::RESOURCE_UNAVAILABLE, "resources-unavailable"},
    {QCause::QUALITY_OF_SERVICE_NOT_AVAILABLE, "qos-unavailable"},
    {QCause::REQUESTED_FACILITY_NOT_SUBSCRIBED, "facility-not-subscribed"},
    {QCause::BEARER_CAPABILITY_NOT_AUTHORIZED, "bearer-capability-not-authorized"},
    {QCause::BEARER_CAPABILITY_NOT_PRESENTLY_AVAILABLE, "bearer-capability-not-available"},
    {QCause::SERVICE_OR_OPTION_NOT_AVAILABLE, "service-or-option-not-available"},
    {QCause::BEARER_CAPABILITY_NOT_IMPLEMENTED, "bearer-capability-not-implemented"},
    {QCause::CHANNEL_TYPE_NOT_IMPLEMENTED, "channel-type-not-implemented"},
    {QCause::REQUESTED_FACILITY_NOT_IMPLEMENTED, "facility-not-implemented"},
    {QCause::ONLY_RESTRICTED_DIGITAL_BEARER_AVAILABLE, "only-restricted-digital-available"},
    {QCause::SERVICE_OR_OPTION_NOT_IMPLEMENTED, "service-or-option-not-implemented"},
    {QCause::INVALID_CALL_REFERENCE_VALUE, "invalid-call-reference"},
    {QCause::IDENTIFIED_CHANNEL_DOES_NOT_EXIST, "channel-does-not-exist"},
    {QCause::SUSPENDED_CALL_HAS_OTHER_IDENTITY, "call-identity-does-not-exist"},
    {QCause::CALL_IDENTITY_IN_USE, "call-identity-in-use"},
    {QCause::NO_CALL_SUSPENDED, "no-call-suspended"},
    {QCause::CALL_WITH_IDENTITY_CLEARED, "call-has-been-cleared"},
    {QCause::INCOMPATIBLE_DESTINATION, "incompatible-destination"},
    {QCause::INVALID_TRANSIT_NETWORK_SELECTION, "invalid-transit-network"},
    {QCause::INVALID_MESSAGE, "invalid-message"},
    {QCause::MANDATORY_INFORMATION_ELEMENT_MISSING, "mandatory-ie-missing"},
    {QCause::MESSAGE_TYPE_NOT_IMPLEMENTED, "message-type-not-implemented"},
    {QCause::MESSAGE_NOT_COMPATIBLE_OR_NOT_IMPLEMENTED, "message-type-not-state-compatible"},
    {QCause::INFORMATION_ELEMENT_NOT_IMPLEMENTED, "ie-does-not-exist"},
    {QCause::INVALID_INFORMATION_ELEMENT_CONTENTS, "invalid-ie-contents"},
    {QCause::MESSAGE_NOT_COMPATIBLE_WITH_CALL_STATE, "message-not-state-compatible"},
    {QCause::RECOVERY_ON_TIMER_EXPIRY, "recovery-on-timer-expiry"},
    {QCause::PROTOCOL_ERROR, "protocol-error"},
    {QCause::INTERWORKING, "interworking"},
};
static_assert(std::size(CAUSES) == 54);

constexpr NamedValue<QReasonForRedirection> REASONS[] = {
    {QReasonForRedirection::UNKNOWN, "unknown"},
    {QReasonForRedirection::FORWARDING_BUSY, "cfb"},
    {QReasonForRedirection::FORWARDING_NO_REPLY, "cfnr"},
    {QReasonForRedirection::CALL_DEFLECTION, "cd"},
    {QReasonForRedirection::OUT_OF_ORDER, "ooo"},
    {QReasonForRedirection::FORWARDING_BY_CALLED, "cfcd"},
    {QReasonForRedirection::FORWARDING_UNCONDITIONAL, "cfu"},
};

template <class Value, std::size_t SIZE>
char const* SHORT_NAME(NamedValue<Value> const (&table)[SIZE], Value value)
{
    return value == Value::UNSPECIFIED ? UNSPECIFIED_NAME : NAME_OF(table, value, NO_NAME);
}

template <class Value, std::size_t SIZE>
Value BY_INDEX(NamedValue<Value> const (&table)[SIZE], unsigned int index)
{
    return index < SIZE ? table[index].value : Value::UNSPECIFIED;
}

template <class Value, std::size_t SIZE>
Value BY_SHORT_NAME(NamedValue<Value> const (&table)[SIZE], String const& name)
{
    for (NamedValue<Value> const& row : table)
        if (name == row.name)
            return row.value;
    return Value::UNSPECIFIED;
}
} // namespace

char const* CAUSE_SHORT_NAME(QCause cause) { return SHORT_NAME(CAUSES, cause); }

QCause GET_CAUSE_BY_INDEX(unsigned int index) { return BY_INDEX(CAUSES, index); }

unsigned int GET_CAUSE_SIZE() { return std::size(CAUSES); }

QCause GET_CAUSE_BY_SHORT_NAME(String const& name) { return BY_SHORT_NAME(CAUSES, name); }

char const* REASON_FOR_REDIRECTION_SHORT_NAME(QReasonForRedirection reason) { return SHORT_NAME(REASONS, reason); }

QReasonForRedirection GET_REASON_FOR_REDIRECTION_BY_INDEX(unsigned int index) { return BY_INDEX(REASONS, index); }

QReasonForRedirection GET_REASON_FOR_REDIRECTION_BY_SHORT_NAME(String const& name)
{
    return BY_SHORT_NAME(REASONS, name);
}
