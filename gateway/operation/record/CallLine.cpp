#include "operation/record/CallLine.h"

#include "diagnosis/SafeText.h"
#include "properties/CC_Cause.h"

#include <spdlog/fmt/fmt.h>

namespace
{
std::string PARTY_OF(CallRecord::Leg const* leg)
{
    return leg != nullptr ? CallLine::NUMBER_OF(*leg) + " on " + leg->interface : "nobody";
}

std::string END_OF(CallRecord const& record)
{
    CallRecord::Leg const* const clearing = record.getClearing();
    std::string text = record.isClearedByGateway ? ", cleared by the gateway"
                       : clearing != nullptr     ? ", cleared by " + clearing->interface
                                                 : "";
    if (clearing == nullptr)
        return text;
    text += fmt::format(", cause {} ({})", clearing->cause, CAUSE_SHORT_NAME(static_cast<QCause>(clearing->cause)));
    if (clearing->sipStatus != 0)
        text += fmt::format(", SIP {}", clearing->sipStatus);
    return clearing->causeText.empty() ? text : text + ", \"" + clearing->causeText + '"';
}

std::string IDS_OF(CallRecord const& record)
{
    std::string text;
    for (CallRecord::Leg const& leg : record.legs)
        if (!leg.id.empty())
            text += (text.empty() ? ", ids " : " and ") + leg.id;
    return text;
}
} // namespace

std::string CallLine::NUMBER_OF(CallRecord::Leg const& leg)
{
    if (leg.presentation == CallRecord::Presentation::RESTRICTED)
        return "(withheld)";
    return leg.number.empty() ? "(none)" : leg.number;
}

std::string CallLine::TEXT_OF(CallRecord const& record)
{
    std::string const answer =
        record.answered ? fmt::format("answered after {:.3f} s", *record.answered) : "not answered";
    std::string text = fmt::format("call {}: {}{} to {}, {}, over after {:.3f} s{}{}", record.serial,
                                   record.isEmergency ? "emergency, " : "", PARTY_OF(record.getCaller()),
                                   PARTY_OF(record.getCalled()), answer, record.ended, END_OF(record), IDS_OF(record));
    if (record.legs.size() > 2)
        text += fmt::format(", {} parties in all", record.legs.size());
    return SAFE_TEXT(text);
}
