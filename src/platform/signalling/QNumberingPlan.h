#pragma once

#include "platform/base/Export.h"

/// The plan that a number belongs to: the numbering plan identification of a Q.931 number element (octet 3, bits 4 to
/// 1). It has a meaning with the types of number UNKNOWN, INTERNATIONAL, NATIONAL and SUBSCRIBER only.
enum class QNumberingPlan : int
{
    UNKNOWN = 0,
    ISDN = 1,
    DATA = 3,
    TELEX = 4,
    NATIONAL_STANDARD = 8,
    PRIVATE = 9,
    RESERVED_FOR_EXTENSION = 15
};

/// The name that Q.931 gives the value, ERROR::INVALID for a value without one.
CC_EXPORT char const* QNUMBERING_PLAN_NAME(QNumberingPlan value);
