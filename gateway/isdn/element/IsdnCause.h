#pragma once

#include "platform/signalling/QCause.h"

/// Why a call ends: the element Cause (Q.850, 2.1; Q.931, 4.5.12). The value is the same on both sides. Location and
/// diagnostics the stack hands on in neither direction.
namespace IsdnCause
{
/// What the far side said; without a value 31, normal unspecified (Q.850, 2.2.7.1.7).
QCause FROM_WIRE(int value);
/// What the far side is told: without a value of Q.850 16, normal call clearing.
int TO_WIRE(QCause cause);
} // namespace IsdnCause
