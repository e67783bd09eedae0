#include "platform/media/MG_Tones.h"

#include "platform/base/NameOf.h"

namespace
{
using Tone = MG_Tones::ECallProgressTone;

constexpr NamedValue<Tone::Type> s_names[] = {
    {Tone::NONE, "no tone"},
    {Tone::DIAL, "dial tone"},
    {Tone::INTERNAL_DIAL, "internal dial tone"},
    {Tone::SPECIAL_DIAL, "special dial tone"},
    {Tone::SECOND_DIAL, "second dial tone"},
    {Tone::RECALL_DIAL, "recall dial tone"},
    {Tone::RINGING, "ringing tone"},
    {Tone::SPECIAL_RINGING, "special ringing tone"},
    {Tone::BUSY, "busy tone"},
    {Tone::CONGESTION, "congestion tone"},
    {Tone::SPECIAL_INFORMATION, "special information tone"},
    {Tone::INTERCEPT, "intercept tone"},
    {Tone::NUMBER_UNOBTAINABLE, "number unobtainable tone"},
    {Tone::WARNING, "warning tone"},
    {Tone::RECORD, "record tone"},
    {Tone::PAYPHONE_RECOGNITION, "payphone recognition tone"},
    {Tone::CALL_WAITING, "call waiting tone"},
    {Tone::CALLER_WAITING, "caller waiting tone"},
    {Tone::CONFIRMATION, "confirmation tone"},
    {Tone::POSITIVE_INDICATION, "positive indication tone"},
    {Tone::NEGATIVE_INDICATION, "negative indication tone"},
    {Tone::REFUSAL, "refusal tone"},
    {Tone::ACCEPTANCE, "acceptance tone"},
    {Tone::ANSWER, "answer tone"},
    {Tone::COMFORT, "comfort tone"},
    {Tone::HOLD, "hold tone"},
    {Tone::PAY, "pay tone"},
    {Tone::INTRUSION, "intrusion tone"},
    {Tone::OFFERING, "offering tone"},
    {Tone::CONFERENCE, "conference tone"},
    {Tone::END_OF_THREE_PARTY, "end of three-party service tone"},
    {Tone::OFF_HOOK_WARNING, "off-hook warning tone"},
    {Tone::PERMANENT_SIGNAL, "permanent signal tone"},
    {Tone::LINE_LOCK_OUT, "line lock-out tone"},
    {Tone::PREEMPTION, "preemption tone"},
    {Tone::QUEUE, "queue tone"},
    {Tone::ROUTE, "route tone"},
    {Tone::VALID, "valid tone"},
    {Tone::WAITING, "waiting tone"},
    {Tone::FACILITIES, "facilities tone"},
    {Tone::CALLING_CARD, "calling card service tone"},
    {Tone::END_OF_PERIOD_WARNING, "end of period warning tone"},
    {Tone::WARNING_PIP, "warning pip tone"},
    {Tone::CPE_ALERTING, "CPE alerting signal"},
};
} // namespace

char const* MG_Tones::ECallProgressTone::NAME(Type tone) { return NAME_OF(s_names, tone); }
