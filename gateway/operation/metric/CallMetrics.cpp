#include "operation/metric/CallMetrics.h"

#include "operation/record/CallWatch.h"

#include <algorithm>
#include <array>

namespace
{
constexpr int MOST_CAUSES = 127; // Q.850
constexpr double MILLISECOND = 1e-3;

enum Progress : std::size_t
{
    DIALLED,
    RINGING,
    ANSWERED
};
constexpr std::array<std::string_view, 3> PROGRESS_NAMES{"dialled", "ringing", "answered"};
constexpr std::array<std::string_view, 2> SIDE_NAMES{"called", "calling"}; // by whether it is calling

Progress PROGRESS_OF(CallRecord const& record)
{
    return record.answered ? ANSWERED : record.ringing ? RINGING : DIALLED;
}

using CallsUp = std::map<std::string_view, std::array<std::array<unsigned long long, 3>, 2>>;

void COUNT(CallsUp& calls, CallRecord const& record)
{
    for (CallRecord::Leg const& leg : record.legs)
        ++calls[leg.interface][leg.isCalling ? 1 : 0][PROGRESS_OF(record)];
}

void ADD_UP(MetricText& text, CallsUp const& calls)
{
    text.begin("calls", MetricText::GAUGE, "Calls that are up, by the interfaces of their parties");
    for (auto const& [interface, ofSides] : calls)
        for (std::size_t side = 0; side < ofSides.size(); ++side)
            for (std::size_t progress = 0; progress < ofSides[side].size(); ++progress)
                text.add(ofSides[side][progress],
                         {{"interface", interface}, {"side", SIDE_NAMES[side]}, {"state", PROGRESS_NAMES[progress]}});
}
} // namespace

void CallMetrics::note(CallRecord const& record)
{
    for (CallRecord::Leg const& leg : record.legs)
    {
        int const cause = leg.cause > 0 && leg.cause <= MOST_CAUSES ? leg.cause : 0;
        ++m_ended[{leg.interface, leg.isCalling, record.answered.has_value(), cause}];
        Interface& interface = m_interfaces[leg.interface];
        if (leg.quality)
            noteQuality(*leg.quality, interface);
    }
    if (CallRecord::Leg const* const called = record.getCalled())
        noteTimes(record, *called);
}

void CallMetrics::noteTimes(CallRecord const& record, CallRecord::Leg const& called)
{
    Interface& interface = m_interfaces[called.interface];
    if (record.ringing || record.answered)
        interface.delay.note(record.ringing ? *record.ringing : *record.answered);
    if (!record.answered)
        return;
    interface.setUp.note(*record.answered);
    interface.duration.note(record.ended - *record.answered);
}

void CallMetrics::noteQuality(CallRecord::Quality const& quality, Interface& interface)
{
    if (quality.opinion > 0)
        interface.opinion.note(quality.opinion);
    if (!quality.isMeasured)
        return;
    interface.received += quality.received;
    interface.sent += quality.sent;
    interface.lost += quality.lost;
    if (quality.received != 0)
        interface.jitter.note(quality.jitter * MILLISECOND);
    if (quality.roundTrip != 0)
        interface.roundTrip.note(quality.roundTrip * MILLISECOND);
}

void CallMetrics::add(MetricText& text, CallWatch const& watch) const
{
    CallsUp calls;
    double oldest = 0;
    watch.visit(
        [&](CallRecord const& record, double age)
        {
            COUNT(calls, record);
            oldest = std::max(oldest, age);
        });
    ADD_UP(text, calls);
    text.begin("oldest_call_age_seconds", MetricText::GAUGE, "The age of the oldest call that is up, 0 without any");
    text.add(oldest);
    addEnded(text);
    addTimes(text);
    addMedia(text);
}

void CallMetrics::addEnded(MetricText& text) const
{
    text.begin("call_parties_total", MetricText::COUNTER,
               "Parties of calls that are over, by the cause of Q.850 (0: none) and whether the call was answered");
    for (auto const& [ended, number] : m_ended)
        text.add(number, {{"interface", ended.interface},
                          {"side", SIDE_NAMES[ended.isCalling ? 1 : 0]},
                          {"cause", std::to_string(ended.cause)},
                          {"answered", ended.isAnswered ? "yes" : "no"}});
}

template <class Member>
void CallMetrics::addOfEach(MetricText& text, Member Interface::*member) const
{
    for (auto const& [name, interface] : m_interfaces)
        text.add(interface.*member, {{"interface", name}});
}

void CallMetrics::addTimes(MetricText& text) const
{
    text.begin("post_dial_delay_seconds", MetricText::HISTOGRAM,
               "From a call's begin until the called party rang or answered, by the interface where it left");
    addOfEach(text, &Interface::delay);
    text.begin("set_up_seconds", MetricText::HISTOGRAM,
               "From a call's begin until it was answered, by the interface where it left");
    addOfEach(text, &Interface::setUp);
    text.begin("call_duration_seconds", MetricText::HISTOGRAM,
               "From the answer until the end, by the interface where the call left");
    addOfEach(text, &Interface::duration);
}

void CallMetrics::addMedia(MetricText& text) const
{
    text.begin("opinion_score", MetricText::HISTOGRAM,
               "Mean opinion scores of what was received of parties, at the end of each call");
    addOfEach(text, &Interface::opinion);
    text.begin("jitter_seconds", MetricText::HISTOGRAM, "Jitter of what was received, at the end of each call");
    addOfEach(text, &Interface::jitter);
    text.begin("round_trip_seconds", MetricText::HISTOGRAM, "Round trips, as RTCP tells, at the end of each call");
    addOfEach(text, &Interface::roundTrip);
    text.begin("media_packets_received_total", MetricText::COUNTER, "RTP packets of the calls that are over");
    addOfEach(text, &Interface::received);
    text.begin("media_packets_sent_total", MetricText::COUNTER, "RTP packets of the calls that are over");
    addOfEach(text, &Interface::sent);
    text.begin("media_packets_lost_total", MetricText::COUNTER,
               "RTP packets that did not come, of calls that are over");
    addOfEach(text, &Interface::lost);
}
