#include "platform/signalling/QPresentationIndicator.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<QPresentationIndicator> s_names[] = {
    {QPresentationIndicator::ALLOWED, "Presentation allowed"},
    {QPresentationIndicator::RESTRICTED, "Presentation restricted"},
    {QPresentationIndicator::NOT_AVAILABLE, "Number not available due to interworking"},
    {QPresentationIndicator::RESERVED, "Reserved"},
};
} // namespace

char const* QPRESENTATION_INDICATOR_NAME(QPresentationIndicator value) { return NAME_OF(s_names, value); }
