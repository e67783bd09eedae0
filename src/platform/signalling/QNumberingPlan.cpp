#include "platform/signalling/QNumberingPlan.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<QNumberingPlan> s_names[] = {
    {QNumberingPlan::UNKNOWN, "Unknown"},
    {QNumberingPlan::ISDN, "ISDN/telephony numbering plan (Recommendation E.164)"},
    {QNumberingPlan::DATA, "Data numbering plan (Recommendation X.121)"},
    {QNumberingPlan::TELEX, "Telex numbering plan (Recommendation F.69)"},
    {QNumberingPlan::NATIONAL_STANDARD, "National standard numbering plan"},
    {QNumberingPlan::PRIVATE, "Private numbering plan"},
    {QNumberingPlan::RESERVED_FOR_EXTENSION, "Reserved for extension"},
};
} // namespace

char const* QNUMBERING_PLAN_NAME(QNumberingPlan value) { return NAME_OF(s_names, value); }
