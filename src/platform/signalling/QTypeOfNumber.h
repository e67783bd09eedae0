#pragma once

#include "platform/base/Export.h"

/// What a number begins with: the type of number of a Q.931 number element (octet 3, bits 7 to 5), as the plain value
/// of the field. Value 5 is not assigned.
enum class QTypeOfNumber : int
{
    UNKNOWN = 0,
    INTERNATIONAL = 1,
    NATIONAL = 2,
    NETWORK_SPECIFIC = 3,
    SUBSCRIBER = 4,
    ABBREVIATED = 6,
    RESERVED_FOR_EXTENSION = 7
};

/// The name that Q.931 gives the value, ERROR::INVALID for a value without one.
CC_EXPORT char const* QTYPE_OF_NUMBER_NAME(QTypeOfNumber value);
