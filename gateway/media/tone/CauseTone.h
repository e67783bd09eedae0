#pragma once

#include "platform/media/MG_Tones.h"
#include "platform/signalling/QCause.h"

/// What a caller hears of a call that fails (ITU-T E.182; the causes are those of Q.850): busy for a busy user,
/// congestion where there is no path or equipment, special information for what another try would not mend. Nothing for
/// a call that has ended in order, or because nobody has answered: he has heard it ring.
namespace CauseTone
{
MG_Tones::ECallProgressTone::Type OF(QCause cause);
}
