#pragma once

#include "platform/media/MG_Rtp.h"

#include <optional>

/// How a connection sounds, by the E-model (ITU-T G.107) with its default values but for delay, codec and loss.
namespace EModel
{
/// The mean opinion score in hundredths, 100 to 450. `lossPercent`: 0 to 100, of packets, taken for random. `delay`:
/// milliseconds from mouth to ear; echoes are taken for cancelled. Absent for a codec for which ITU-T G.113, appendix
/// I, tells no impairment and robustness in the narrow band.
std::optional<unsigned int> SCORE(MG_Rtp::ECodec::Type codec, double lossPercent, double delay);
/// The score of a rating R of 0 to 100, annex B.
double SCORE_OF_RATING(double rating);
} // namespace EModel
