#pragma once

#include "media/context/MediaAddress.h"
#include "media/rtp/RtcpPacket.h"

/// An RTCP packet of a leg, as it was in the clear. A plain value.
struct MediaReport
{
    RtcpPacket packet; ///< of the reports in it, the one about the other end
    MediaAddress from;
    MediaAddress to;
};
