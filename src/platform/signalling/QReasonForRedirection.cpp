#include "platform/signalling/QReasonForRedirection.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<QReasonForRedirection> s_names[] = {
    {QReasonForRedirection::UNSPECIFIED, "Unspecified"},
    {QReasonForRedirection::UNKNOWN, "Unknown"},
    {QReasonForRedirection::FORWARDING_BUSY, "Call forwarding busy or called DTE busy"},
    {QReasonForRedirection::FORWARDING_NO_REPLY, "Call forwarding no reply"},
    {QReasonForRedirection::CALL_DEFLECTION, "Call deflection"},
    {QReasonForRedirection::OUT_OF_ORDER, "Called DTE out of order"},
    {QReasonForRedirection::FORWARDING_BY_CALLED, "Call forwarding by the called DTE"},
    {QReasonForRedirection::FORWARDING_UNCONDITIONAL, "Call forwarding unconditional or systematic call redirection"},
};
} // namespace

char const* QREASON_FOR_REDIRECTION_NAME(QReasonForRedirection value) { return NAME_OF(s_names, value); }
