#pragma once

#include "isdn/link/LibPri.h"

/// What is known of the way of a call: the element Progress Indicator (Q.931, 4.5.23), octet 4. A plain value.
///
///     1, 2, 3  interworking, an end that is not ISDN    Endpoint-Is-ISDN false
///     8        tones or announcements in the channel     Provides-Data true
struct IsdnProgress
{
    bool isInBand = false;
    bool isIsdn = true;

    /// `mask`: the stack's, a bit for each description.
    static IsdnProgress OF(int mask)
    {
        constexpr int NOT_ISDN = PRI_PROG_CALL_NOT_E2E_ISDN | PRI_PROG_CALLED_NOT_ISDN | PRI_PROG_CALLER_NOT_ISDN;
        return {(mask & PRI_PROG_INBAND_AVAILABLE) != 0, (mask & NOT_ISDN) == 0};
    }
};
