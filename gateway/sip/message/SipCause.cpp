#include "sip/message/SipCause.h"

#include "properties/CC_PropertyId.h"
#include "sip/message/SipReason.h"

#include <algorithm>
#include <iterator>

namespace
{
struct StatusRow
{
    unsigned int status;
    QCause cause;
};

constexpr StatusRow CAUSES_BY_STATUS[] = {
    {400, QCause::TEMPORARY_FAILURE},
    {401, QCause::CALL_REJECTED},
    {402, QCause::CALL_REJECTED},
    {403, QCause::CALL_REJECTED},
    {404, QCause::UNALLOCATED_NUMBER},
    {405, QCause::SERVICE_OR_OPTION_NOT_AVAILABLE},
    {406, QCause::SERVICE_OR_OPTION_NOT_IMPLEMENTED},
    {407, QCause::CALL_REJECTED},
    {408, QCause::RECOVERY_ON_TIMER_EXPIRY},
    {410, QCause::NUMBER_CHANGED},
    {413, QCause::INTERWORKING},
    {414, QCause::INTERWORKING},
    {415, QCause::SERVICE_OR_OPTION_NOT_IMPLEMENTED},
    {416, QCause::INTERWORKING},
    {420, QCause::INTERWORKING},
    {421, QCause::INTERWORKING},
    {423, QCause::INTERWORKING},
    {480, QCause::NO_USER_RESPONDING},
    {481, QCause::TEMPORARY_FAILURE},
    {482, QCause::EXCHANGE_ROUTING_ERROR},
    {483, QCause::EXCHANGE_ROUTING_ERROR},
    {484, QCause::INVALID_NUMBER_FORMAT},
    {485, QCause::UNALLOCATED_NUMBER},
    {486, QCause::USER_BUSY},
    {487, QCause::NORMAL_UNSPECIFIED}, // the RFC gives 487, 488 and 606 no fixed cause
    {488, QCause::INTERWORKING},
    {500, QCause::TEMPORARY_FAILURE},
    {501, QCause::SERVICE_OR_OPTION_NOT_IMPLEMENTED},
    {502, QCause::NETWORK_OUT_OF_ORDER},
    {503, QCause::TEMPORARY_FAILURE},
    {504, QCause::RECOVERY_ON_TIMER_EXPIRY},
    {505, QCause::INTERWORKING},
    {513, QCause::INTERWORKING},
    {600, QCause::USER_BUSY},
    {603, QCause::CALL_REJECTED},
    {604, QCause::UNALLOCATED_NUMBER},
    {606, QCause::INTERWORKING},
};

constexpr StatusRow STATUSES_BY_CAUSE[] = {
    {404, QCause::UNALLOCATED_NUMBER},
    {404, QCause::NO_ROUTE_TO_TRANSIT_NETWORK},
    {404, QCause::NO_ROUTE_TO_DESTINATION},
    {480, QCause::NORMAL_CALL_CLEARING}, // a release before the answer: the RFC expects none
    {486, QCause::USER_BUSY},
    {408, QCause::NO_USER_RESPONDING},
    {480, QCause::NO_ANSWER_FROM_USER},
    {480, QCause::SUBSCRIBER_ABSENT},
    {403, QCause::CALL_REJECTED},
    {410, QCause::NUMBER_CHANGED},
    {410, QCause::REDIRECTION_TO_NEW_DESTINATION},
    {483, QCause::EXCHANGE_ROUTING_ERROR},
    {404, QCause::NON_SELECTED_USER_CLEARING},
    {502, QCause::DESTINATION_OUT_OF_ORDER},
    {484, QCause::INVALID_NUMBER_FORMAT},
    {501, QCause::FACILITY_REJECTED},
    {480, QCause::NORMAL_UNSPECIFIED},
    {503, QCause::NO_CIRCUIT_CHANNEL_AVAILABLE},
    {503, QCause::NETWORK_OUT_OF_ORDER},
    {503, QCause::TEMPORARY_FAILURE},
    {503, QCause::SWITCHING_EQUIPMENT_CONGESTION},
    {503, QCause::RESOURCE_UNAVAILABLE},
    {403, QCause::INCOMING_CALLS_BARRED_WITHIN_CUG},
    {403, QCause::BEARER_CAPABILITY_NOT_AUTHORIZED},
    {503, QCause::BEARER_CAPABILITY_NOT_PRESENTLY_AVAILABLE},
    {488, QCause::BEARER_CAPABILITY_NOT_IMPLEMENTED},
    {488, QCause::ONLY_RESTRICTED_DIGITAL_BEARER_AVAILABLE},
    {501, QCause::SERVICE_OR_OPTION_NOT_IMPLEMENTED},
    {403, QCause::USER_NOT_MEMBER_OF_CUG},
    {503, QCause::INCOMPATIBLE_DESTINATION},
    {504, QCause::RECOVERY_ON_TIMER_EXPIRY},
    {500, QCause::PROTOCOL_ERROR},
    {500, QCause::INTERWORKING},
};

/// Final statuses that need headers or credentials of their own to mean anything to somebody else.
constexpr unsigned int NOT_PASSED_ON[] = {401, 402, 405, 407, 415, 420, 421, 422, 423, 481, 482, 491, 494};
} // namespace

QCause SipCause::CAUSE_OF_STATUS(unsigned int status)
{
    for (unsigned int const asked : {status, status / 100 * 100})
        for (StatusRow const& row : CAUSES_BY_STATUS)
            if (row.status == asked)
                return row.cause;
    return QCause::NORMAL_UNSPECIFIED;
}

unsigned int SipCause::STATUS_OF_CAUSE(QCause cause)
{
    auto const* const found = std::find_if(std::begin(STATUSES_BY_CAUSE), std::end(STATUSES_BY_CAUSE),
                                           [&](StatusRow const& row) { return row.cause == cause; });
    return found != std::end(STATUSES_BY_CAUSE) ? found->status : 500;
}

SipCause SipCause::FROM_RESPONSE(unsigned int status, std::string_view phrase, std::string_view reasonHeader)
{
    SipReason const reason = SipReason::PARSE(reasonHeader);
    SipCause result;
    result.cause = reason.q850Cause != 0 ? static_cast<QCause>(reason.q850Cause) : CAUSE_OF_STATUS(status);
    if (status < 400 && reason.q850Cause == 0)
        result.cause = QCause::REDIRECTION_TO_NEW_DESTINATION; // one that is not followed
    result.sipCode = status;
    result.text = reason.text.empty() ? SipReason::UNQUOTE(phrase) : reason.text;
    return result;
}

SipCause SipCause::FROM_REQUEST(std::string_view reasonHeader)
{
    SipReason const reason = SipReason::PARSE(reasonHeader);
    SipCause result;
    if (reason.q850Cause != 0)
        result.cause = static_cast<QCause>(reason.q850Cause);
    else if (reason.sipCode == 200) // of a CANCEL: another phone of the callee's took the call
        result.cause = QCause::NON_SELECTED_USER_CLEARING;
    else if (reason.sipCode >= 400)
        result.cause = CAUSE_OF_STATUS(reason.sipCode);
    result.sipCode = reason.sipCode;
    result.text = reason.text;
    return result;
}

SipCause SipCause::FROM_PROPERTY(CC_PropertyCause const* property)
{
    SipCause result;
    if (property == nullptr)
        return result;
    result.sipCode = property->getSipCode();
    result.text = property->getText().view();
    bool const hasCause = property->getCause() != QCause::NONE && property->getCause() != QCause::UNSPECIFIED;
    if (hasCause)
        result.cause = property->getCause();
    else if (result.sipCode >= 400)
        result.cause = CAUSE_OF_STATUS(result.sipCode);
    return result;
}

CC_PropertyCause SipCause::getProperty() const
{
    CC_PropertyCause property(CC_PropertyId::CAUSE, cause, sipCode);
    property.setText(String(std::string_view(text)));
    return property;
}

unsigned int SipCause::getFinalStatus() const
{
    bool const isFinal = sipCode >= 400 && sipCode <= 699;
    bool const isOurs =
        std::find(std::begin(NOT_PASSED_ON), std::end(NOT_PASSED_ON), sipCode) == std::end(NOT_PASSED_ON);
    return isFinal && isOurs ? sipCode : STATUS_OF_CAUSE(cause);
}

std::string SipCause::getReasonHeader(bool isRequest) const
{
    String value;
    std::string header(CC_PropertyCause(CC_PropertyId::CAUSE, cause, 0).getReasonHeaderString(value).view());
    if (!isRequest || sipCode == 0)
        return header;
    CC_PropertyCause sip(CC_PropertyId::CAUSE, QCause::NONE, sipCode);
    sip.setText(String(std::string_view(SipReason::ESCAPE(text))));
    if (!header.empty())
        header += ", ";
    header += sip.getReasonHeaderString(value).view();
    return header;
}
