#pragma once

#include "media/context/MediaDescription.h"

#include <optional>
#include <string>
#include <string_view>

/// The one stream that the gateway's own media carry: the first of a session description that is voice over plain RTP
/// and not refused. Nothing here keeps state.
///
///     std::string const toPeer = SipStream::WITH_ADDRESS(fromOtherSide, {leg.getLocalRtp(), 7, 1});
///     ...
///     if (auto const agreed = SipStream::AGREED(toPeer, fromPeer))
///         leg.describe(*agreed);
namespace SipStream
{
/// Who a description is said to come from (RFC 8866, 5.2): where we listen, and numbers of ours.
struct Origin
{
    MediaAddress rtp;
    unsigned long long session = 0;
    unsigned long long version = 0;
};

/// The description as if we had written it: its stream comes to us, with those formats alone that the media layer
/// relays (RTCP at the port above, no keys, no candidates); every other stream is refused. Empty when it cannot be
/// read.
std::string WITH_ADDRESS(std::string_view description, Origin const& origin);

/// What two descriptions agree on: ours as it went to the far side, and the far side's. Nothing without a stream that
/// both have.
std::optional<MediaDescription> AGREED(std::string_view ours, std::string_view far);
} // namespace SipStream
