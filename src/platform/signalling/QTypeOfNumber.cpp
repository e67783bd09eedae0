#include "platform/signalling/QTypeOfNumber.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<QTypeOfNumber> s_names[] = {
    {QTypeOfNumber::UNKNOWN, "Unknown"},
    {QTypeOfNumber::INTERNATIONAL, "International number"},
    {QTypeOfNumber::NATIONAL, "National number"},
    {QTypeOfNumber::NETWORK_SPECIFIC, "Network specific number"},
    {QTypeOfNumber::SUBSCRIBER, "Subscriber number"},
    {QTypeOfNumber::ABBREVIATED, "Abbreviated number"},
    {QTypeOfNumber::RESERVED_FOR_EXTENSION, "Reserved for extension"},
};
} // namespace

char const* QTYPE_OF_NUMBER_NAME(QTypeOfNumber value) { return NAME_OF(s_names, value); }
