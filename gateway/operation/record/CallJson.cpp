#include "operation/record/CallJson.h"

#include "diagnosis/CC_JsonLine.h"

#include <array>
#include <ctime>
#include <spdlog/fmt/fmt.h>

namespace
{
constexpr std::int64_t NANOSECONDS = 1000000000; // in a second
constexpr std::int64_t IN_MILLISECOND = 1000000;

/// ISO 8601, of UTC, up to the second.
std::string UP_TO_SECOND(std::int64_t nanoseconds)
{
    std::time_t const seconds = nanoseconds / NANOSECONDS;
    std::tm parts = {};
    gmtime_r(&seconds, &parts);
    std::array<char, 32> text{};
    std::strftime(text.data(), text.size(), "%Y-%m-%dT%H:%M:%S", &parts);
    return text.data();
}

std::string TIME(std::int64_t nanoseconds)
{
    return fmt::format("{}.{:03}Z", UP_TO_SECOND(nanoseconds), nanoseconds % NANOSECONDS / IN_MILLISECOND);
}

std::string SECONDS(std::optional<double> const& seconds) { return seconds ? fmt::format("{:.3f}", *seconds) : "null"; }

std::string TEXT_OR_NULL(std::string const& text, bool isShown = true)
{
    return text.empty() || !isShown ? "null" : CC_JsonLine::QUOTED(text);
}

std::string QUALITY(CallRecord::Quality const& quality)
{
    CC_JsonLine line;
    line.addJson("codec", TEXT_OR_NULL(quality.codec))
        .addJson("opinion", quality.opinion > 0 ? fmt::format("{:.2f}", quality.opinion) : "null");
    if (!quality.isMeasured)
        return line.addJson("measured", "null").get();
    CC_JsonLine measured;
    measured.add("received", static_cast<unsigned long long>(quality.received))
        .add("receivedOctets", static_cast<unsigned long long>(quality.receivedOctets))
        .add("sent", static_cast<unsigned long long>(quality.sent))
        .add("sentOctets", static_cast<unsigned long long>(quality.sentOctets))
        .add("lost", static_cast<unsigned long long>(quality.lost))
        .add("jitterMs", static_cast<unsigned long long>(quality.jitter))
        .add("roundTripMs", static_cast<unsigned long long>(quality.roundTrip));
    return line.addJson("measured", measured.get()).get();
}

std::string_view NAME(CallRecord::Presentation presentation)
{
    return presentation == CallRecord::Presentation::ALLOWED      ? "allowed"
           : presentation == CallRecord::Presentation::RESTRICTED ? "restricted"
                                                                  : "not available";
}

std::string REDIRECTION(CallRecord::Leg const& leg, bool isWhole)
{
    bool const isShown = isWhole || !leg.isRedirectingRestricted;
    return CC_JsonLine()
        .addJson("number", TEXT_OR_NULL(leg.redirecting, isShown))
        .add("reason", leg.redirectingReason)
        .addJson("restricted", leg.isRedirectingRestricted ? "true" : "false")
        .get();
}

std::string LEG(CallRecord::Leg const& leg, bool isWhole)
{
    bool const isShown = isWhole || leg.presentation == CallRecord::Presentation::ALLOWED;
    return CC_JsonLine()
        .add("leg", leg.serial)
        .add("interface", leg.interface)
        .add("side", std::string_view(leg.isCalling ? "calling" : "called"))
        .addJson("joinedAfter", SECONDS(leg.joined))
        .addJson("dialled", TEXT_OR_NULL(leg.isCalling ? "" : leg.dialled, isShown))
        .addJson("number", TEXT_OR_NULL(leg.number, isShown))
        .addJson("name", TEXT_OR_NULL(leg.name, isShown))
        .add("presentation", NAME(leg.presentation))
        .addJson("redirection", leg.redirecting.empty() ? "null" : REDIRECTION(leg, isWhole))
        .addJson("id", TEXT_OR_NULL(leg.id))
        .addJson("charge", TEXT_OR_NULL(leg.charge))
        .addJson("cause", leg.cause > 0 ? std::to_string(leg.cause) : "null")
        .addJson("sipStatus", leg.sipStatus != 0 ? std::to_string(leg.sipStatus) : "null")
        .addJson("words", TEXT_OR_NULL(leg.causeText))
        .addJson("quality", leg.quality ? QUALITY(*leg.quality) : "null")
        .get();
}
} // namespace

std::string CallJson::LINE_OF(CallRecord const& record, Context const& context, End end)
{
    bool const isInterrupted = end == End::INTERRUPTED;
    std::string legs;
    for (CallRecord::Leg const& leg : record.legs)
        legs += (legs.empty() ? "" : ",") + LEG(leg, context.isWhole);
    CC_JsonLine line;
    line.add("version", static_cast<unsigned long long>(VERSION))
        .add("call", record.serial)
        .add("process", context.process) // up to here the key
        .add("start", TIME(record.start))
        .addJson("ringingAfter", SECONDS(record.ringing))
        .addJson("answeredAfter", SECONDS(record.answered))
        .addJson("endedAfter", isInterrupted ? "null" : SECONDS(record.ended))
        .addJson("interrupted", isInterrupted ? "true" : "false")
        .addJson("clearedBy", record.clearedBy != 0 ? std::to_string(record.clearedBy) : "null")
        .addJson("clearedByGateway", record.isClearedByGateway ? "true" : "false");
    if (record.isEmergency)
        line.addJson("emergency", "true");
    return line.addJson("legs", "[" + legs + "]").get();
}

std::string CallJson::PROCESS_OF(std::int64_t start)
{
    return fmt::format("{}.{:09}Z", UP_TO_SECOND(start), start % NANOSECONDS);
}

std::string_view CallJson::KEY_OF(std::string_view line) { return line.substr(0, line.find(",\"start\"")); }
