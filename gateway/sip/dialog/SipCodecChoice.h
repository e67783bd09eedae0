#pragma once

#include "platform/media/MG_Rtp.h"
#include "platform/signalling/QInformationTransferCapability.h"

#include <vector>

/// Which codecs are offered to one side of a call, and which one answers the other's offer, by what is known of the
/// side across. To relay wins over to transcode, to transcode over to fail.
///
///     Codecs const offer = SipCodecChoice::FOR_OFFER(interface.codecs, {.supported = supportedByCaller});
///     Codec const answer = SipCodecChoice::FOR_ANSWER(offeredByCaller, {codecOfCalledSide, supportedByCalledSide});
namespace SipCodecChoice
{
using Codec = MG_Rtp::ECodec::Type;
using Codecs = std::vector<Codec>; ///< the best liked first, each once

/// What the other side of the call has told.
struct Across
{
    Codec codec = MG_Rtp::ECodec::NONE; ///< that it speaks; NONE: nothing is agreed on there yet
    Codecs supported{};                 ///< empty: it is not told
};

/// Of the interface's list first what the other side speaks, then what it supports too, then what can be transcoded for
/// it. None: nothing would be understood across.
Codecs FOR_OFFER(Codecs const& own, Across const& across);
/// One of those that our peer has offered and its interface takes; NONE: nothing would be understood across.
Codec FOR_ANSWER(Codecs const& offered, Across const& across);
/// What the call has to carry whose peer offers these.
QInformationTransferCapability CAPABILITY_OF(Codecs const& offered);
/// Whether what is said in the one can be heard in the other: they are the same, or both are spoken here.
bool ARE_COMPATIBLE(Codec one, Codec other);
/// Whether one of them is so.
bool HAS_COMPATIBLE(Codecs const& codecs, Codec other);
/// Those of `codecs` that `others` has too.
Codecs COMMON(Codecs const& codecs, Codecs const& others);
} // namespace SipCodecChoice
