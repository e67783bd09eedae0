#pragma once

#include "host/MetricText.h"
#include "operation/record/CallRecord.h"

#include <map>
#include <string>
#include <tuple>

class CallWatch;

/// What became of all calls since the start, by interface: how they ended, how long they took, how they sounded. On the
/// call-control loop's thread.
///
///     watch.tell([this](CallRecord const& record) { m_calls.note(record); });
///     m_calls.add(text, watch);
class CallMetrics
{
public:
    /// Of a call that is over. Throws std::bad_alloc.
    void note(CallRecord const& record);
    /// `watch`: the calls that are up.
    void add(MetricText& text, CallWatch const& watch) const;

private:
    struct Interface
    {
        // of the calls that left there, in seconds
        MetricHistogram delay{{0.1, 0.2, 0.5, 1, 2, 3, 5, 8, 13, 20}};
        MetricHistogram setUp{{0.1, 0.5, 1, 2, 5, 10, 20, 30, 60, 120}};
        MetricHistogram duration{{1, 5, 15, 30, 60, 120, 300, 600, 1800, 3600}};
        // of the media of every call
        MetricHistogram opinion{{1.5, 2, 2.5, 3, 3.5, 4, 4.25, 4.5}};
        MetricHistogram jitter{{0.001, 0.002, 0.005, 0.01, 0.02, 0.05, 0.1, 0.2}};
        MetricHistogram roundTrip{{0.005, 0.01, 0.02, 0.05, 0.1, 0.2, 0.5, 1}};
        unsigned long long received = 0; ///< packets
        unsigned long long sent = 0;
        unsigned long long lost = 0;
    };
    struct Ended
    {
        std::string interface;
        bool isCalling;
        bool isAnswered;
        int cause;
        friend auto operator<=>(Ended const&, Ended const&) = default;
    };

    void noteTimes(CallRecord const& record, CallRecord::Leg const& called);
    void noteQuality(CallRecord::Quality const& quality, Interface& interface);
    void addEnded(MetricText& text) const;
    void addTimes(MetricText& text) const;
    void addMedia(MetricText& text) const;
    template <class Member>
    void addOfEach(MetricText& text, Member Interface::*member) const;

    std::map<std::string, Interface> m_interfaces; // by name
    std::map<Ended, unsigned long long> m_ended;
};
