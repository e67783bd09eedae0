#pragma once

#include "platform/base/Export.h"

/// What the bearer of a call has to carry: the information transfer capability of a Q.931 bearer capability (octet 3,
/// bits 5 to 1).
enum class QInformationTransferCapability : int
{
    SPEECH = 0,
    UNRESTRICTED_DIGITAL = 8,
    RESTRICTED_DIGITAL = 9,
    AUDIO_3_1_KHZ = 16,
    UNRESTRICTED_DIGITAL_WITH_TONES = 17,
    VIDEO = 24
};

/// The name that Q.931 gives the value, ERROR::INVALID for a value without one.
CC_EXPORT char const* QINFORMATION_TRANSFER_CAPABILITY_NAME(QInformationTransferCapability value);
