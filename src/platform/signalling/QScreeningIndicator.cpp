#include "platform/signalling/QScreeningIndicator.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<QScreeningIndicator> s_names[] = {
    {QScreeningIndicator::USER_PROVIDED_NOT_SCREENED, "User-provided, not screened"},
    {QScreeningIndicator::USER_PROVIDED_PASSED, "User-provided, verified and passed"},
    {QScreeningIndicator::USER_PROVIDED_FAILED, "User-provided, verified and failed"},
    {QScreeningIndicator::NETWORK_PROVIDED, "Network provided"},
};
} // namespace

char const* QSCREENING_INDICATOR_NAME(QScreeningIndicator value) { return NAME_OF(s_names, value); }
