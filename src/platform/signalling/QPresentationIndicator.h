#pragma once

#include "platform/base/Export.h"

/// Whether a number may be shown to the other party: the presentation indicator of a Q.931 number element (octet 3a,
/// bits 7 and 6), as the plain value of the field.
enum class QPresentationIndicator : int
{
    ALLOWED = 0,
    RESTRICTED = 1,
    NOT_AVAILABLE = 2,
    RESERVED = 3
};

/// The name that Q.931 gives the value, ERROR::INVALID for a value without one.
CC_EXPORT char const* QPRESENTATION_INDICATOR_NAME(QPresentationIndicator value);
