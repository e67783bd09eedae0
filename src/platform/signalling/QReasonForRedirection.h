#pragma once

#include "platform/base/Export.h"

/// Why a call was redirected: the reason of a Q.931 redirecting number (octet 3b, bits 4 to 1). ISUP and the diversion
/// services of ISDN number the same reasons differently; those numbers are not values of this type.
enum class QReasonForRedirection : int
{
    UNSPECIFIED = -1, ///< none was given
    UNKNOWN = 0,
    FORWARDING_BUSY = 1,
    FORWARDING_NO_REPLY = 2,
    CALL_DEFLECTION = 4,
    OUT_OF_ORDER = 9,
    FORWARDING_BY_CALLED = 10,
    FORWARDING_UNCONDITIONAL = 15
};

/// The name that Q.931 gives the reason; "Unspecified" for UNSPECIFIED, ERROR::INVALID for a value without a name.
CC_EXPORT char const* QREASON_FOR_REDIRECTION_NAME(QReasonForRedirection value);
