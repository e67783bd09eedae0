#include "media/tone/CauseTone.h"

MG_Tones::ECallProgressTone::Type CauseTone::OF(QCause cause)
{
    using Tone = MG_Tones::ECallProgressTone;
    switch (cause)
    {
    case QCause::NONE:
    case QCause::NORMAL_CALL_CLEARING:
    case QCause::NO_ANSWER_FROM_USER:
    case QCause::NON_SELECTED_USER_CLEARING:
    case QCause::NORMAL_UNSPECIFIED:
        return Tone::NONE;
    case QCause::USER_BUSY:
        return Tone::BUSY;
    case QCause::NO_CIRCUIT_CHANNEL_AVAILABLE:
    case QCause::NETWORK_OUT_OF_ORDER:
    case QCause::TEMPORARY_FAILURE:
    case QCause::SWITCHING_EQUIPMENT_CONGESTION:
    case QCause::REQUESTED_CIRCUIT_CHANNEL_NOT_AVAILABLE:
    case QCause::RESOURCE_UNAVAILABLE:
        return Tone::CONGESTION;
    default:
        return Tone::SPECIAL_INFORMATION;
    }
}
