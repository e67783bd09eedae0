#pragma once

#include "platform/base/Export.h"

/// Who gave a number and whether the network has checked it: the screening indicator of a Q.931 number element
/// (octet 3a, bits 2 and 1).
enum class QScreeningIndicator : int
{
    USER_PROVIDED_NOT_SCREENED = 0,
    USER_PROVIDED_PASSED = 1,
    USER_PROVIDED_FAILED = 2,
    NETWORK_PROVIDED = 3
};

/// The name that Q.931 gives the value, ERROR::INVALID for a value without one.
CC_EXPORT char const* QSCREENING_INDICATOR_NAME(QScreeningIndicator value);
