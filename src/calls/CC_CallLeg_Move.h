#pragma once

#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/base/TYSmallVector.h"

/// A leg's move between calls, while it is under way; on the stack of the outermost one, which holds the leg.
struct CC_CallLeg::Move
{
    explicit Move(CC_Call* from) : source(from) {}

    CC_Call::Hold const source;
    CC_Call::Hold target; // of the move that was asked for meanwhile
    bool isAskedAgain = false;
    TYSmallVector<CC_CallLegObserver const*, 4> given; // the leg observers of the new call that it has already
};
