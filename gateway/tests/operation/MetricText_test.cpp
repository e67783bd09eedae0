#include "host/MetricText.h"

#include "host/TurnTime.h"
#include "operation/metric/CallMetrics.h"
#include "operation/metric/LoopLag.h"
#include "operation/metric/ProcessMetrics.h"
#include "operation/record/CallWatch.h"
#include "platform/eventloop/TYEventLoop.h"

#include <gtest/gtest.h>

namespace
{
bool HAS(std::string const& text, std::string const& line)
{
    return ("\n" + text).find("\n" + line + "\n") != text.npos;
}

CallRecord::Leg LEG(char const* interface, bool isCalling, int cause)
{
    CallRecord::Leg leg;
    leg.interface = interface;
    leg.isCalling = isCalling;
    leg.cause = cause;
    return leg;
}

CallRecord RECORD(std::optional<double> ringing, std::optional<double> answered, double ended, int cause)
{
    CallRecord record;
    record.ringing = ringing;
    record.answered = answered;
    record.ended = ended;
    record.legs = {LEG("trunk", true, cause), LEG("office", false, cause)};
    return record;
}

std::string TEXT_OF(CallMetrics const& metrics)
{
    MetricText text;
    metrics.add(text, CallWatch());
    return text.get();
}

TY::Time s_now;
TY::Time GET_NOW(unsigned int) { return s_now; }
} // namespace

TEST(MetricText, TellsWhatAFamilyIsAndItsSamples)
{
    MetricText text;
    text.begin("calls_total", MetricText::COUNTER, "Calls");
    text.add(7u);
    text.add(0.5, {{"interface", "a"}, {"side", "called"}});
    EXPECT_EQ(text.get(), "# HELP callcontrol_gateway_calls_total Calls\n"
                          "# TYPE callcontrol_gateway_calls_total counter\n"
                          "callcontrol_gateway_calls_total 7\n"
                          "callcontrol_gateway_calls_total{interface=\"a\",side=\"called\"} 0.5\n");
}

TEST(MetricText, KeepsAValueOfALabelOnItsLine)
{
    MetricText text;
    text.begin("process_x", MetricText::GAUGE, "X");
    text.add(1, {{"name", "a\"b\\c\nd"}});
    EXPECT_TRUE(HAS(text.get(), R"(process_x{name="a\"b\\c\nd"} 1)")) << text.get();
}

TEST(MetricText, CountsUpToEachBound)
{
    MetricHistogram histogram({1, 2.5});
    for (double const value : {0.5, 1.0, 2.0, 9.0})
        histogram.note(value);
    MetricText text;
    text.begin("x_seconds", MetricText::HISTOGRAM, "X");
    text.add(histogram, {{"interface", "a"}});
    std::string const name = "callcontrol_gateway_x_seconds";
    EXPECT_TRUE(HAS(text.get(), name + R"(_bucket{interface="a",le="1"} 2)")) << text.get();
    EXPECT_TRUE(HAS(text.get(), name + R"(_bucket{interface="a",le="2.5"} 3)"));
    EXPECT_TRUE(HAS(text.get(), name + R"(_bucket{interface="a",le="+Inf"} 4)"));
    EXPECT_TRUE(HAS(text.get(), name + R"(_sum{interface="a"} 12.5)"));
    EXPECT_TRUE(HAS(text.get(), name + R"(_count{interface="a"} 4)"));
}

TEST(CallMetrics, TellHowCallsEndedAndHowLongTheyTook)
{
    CallMetrics metrics;
    metrics.note(RECORD(0.4, 3, 63, 16));
    metrics.note(RECORD({}, 0.3, 1.3, 16));
    metrics.note(RECORD(2.5, {}, 30, 19));
    metrics.note(RECORD({}, {}, 1, 34));
    metrics.note(RECORD({}, {}, 1, 4711)); // no cause of Q.850
    std::string const text = TEXT_OF(metrics);
    auto const has = [&](std::string const& line) { return HAS(text, "callcontrol_gateway_" + line); };
    EXPECT_TRUE(has(R"(call_parties_total{interface="trunk",side="calling",cause="16",answered="yes"} 2)")) << text;
    EXPECT_TRUE(has(R"(call_parties_total{interface="office",side="called",cause="19",answered="no"} 1)"));
    EXPECT_TRUE(has(R"(call_parties_total{interface="office",side="called",cause="0",answered="no"} 1)"));
    EXPECT_TRUE(has(R"(post_dial_delay_seconds_count{interface="office"} 3)"));
    EXPECT_TRUE(has(R"(post_dial_delay_seconds_bucket{interface="office",le="0.5"} 2)"));
    EXPECT_TRUE(has(R"(set_up_seconds_count{interface="office"} 2)"));
    EXPECT_TRUE(has(R"(call_duration_seconds_sum{interface="office"} 61)"));
    EXPECT_TRUE(has(R"(call_duration_seconds_count{interface="trunk"} 0)"));
}

TEST(CallMetrics, TellHowPartiesSounded)
{
    CallRecord record = RECORD(1, 2, 3, 16);
    CallRecord::Quality quality;
    quality.opinion = 4.1;
    record.legs[0].quality = quality; // nothing was measured
    quality.isMeasured = true;
    quality.received = 95;
    quality.lost = 5;
    quality.sent = 100;
    quality.jitter = 12;
    record.legs[1].quality = quality;
    CallMetrics metrics;
    metrics.note(record);
    metrics.note(record);
    std::string const text = TEXT_OF(metrics);
    auto const has = [&](std::string const& line) { return HAS(text, "callcontrol_gateway_" + line); };
    EXPECT_TRUE(has(R"(media_packets_lost_total{interface="office"} 10)")) << text;
    EXPECT_TRUE(has(R"(media_packets_received_total{interface="office"} 190)"));
    EXPECT_TRUE(has(R"(media_packets_sent_total{interface="office"} 200)"));
    EXPECT_TRUE(has(R"(opinion_score_bucket{interface="office",le="4"} 0)"));
    EXPECT_TRUE(has(R"(opinion_score_bucket{interface="office",le="4.25"} 2)"));
    EXPECT_TRUE(has(R"(opinion_score_count{interface="trunk"} 2)"));
    EXPECT_TRUE(has(R"(jitter_seconds_sum{interface="office"} 0.024)"));
    EXPECT_TRUE(has(R"(jitter_seconds_count{interface="trunk"} 0)"));
    EXPECT_TRUE(has(R"(round_trip_seconds_count{interface="office"} 0)")) << "nobody has measured one";
}

TEST(LoopLag, SaysHowLateATimerRuns)
{
    TYEventLoop loop;
    s_now = TY::Time::NOW(TY::Time::MONOTONIC);
    TY::Time::SET_CLOCK(GET_NOW);
    LoopLag lag(loop);
    for (unsigned int const seconds : {1u, 3u})
    {
        s_now.seconds += seconds;
        loop.runTurn();
    }
    TY::Time::SET_CLOCK(nullptr);
    EXPECT_NEAR(lag.getHistogram().getSum(), 4 - 2 * LoopLag::INTERVAL / 1e3, 1e-6);
    EXPECT_EQ(lag.getHistogram().getCounts()[9], 1u) << "of a second at most";
    EXPECT_EQ(lag.getHistogram().getCounts()[11], 1u) << "of five at most";
}

TEST(ProcessMetrics, TellOfThisProcess)
{
    MetricText text;
    ProcessMetrics::ADD(text);
    EXPECT_NE(text.get().find("\nprocess_resident_memory_bytes "), text.get().npos);
    EXPECT_EQ(text.get().find("\nprocess_resident_memory_bytes 0\n"), text.get().npos);
    EXPECT_EQ(text.get().find("\nprocess_start_time_seconds 0\n"), text.get().npos);
}

TEST(TurnTime, IsProcessorTimeFromOneTurnToTheNext)
{
    TurnTime time;
    EXPECT_EQ(time.getHistogram().getSum(), 0);
    time.note(); // one begins
    unsigned int volatile work = 0;
    for (unsigned int i = 0; i < 3000000; ++i)
        work = work + 1;
    time.note();
    double const busy = time.getHistogram().getSum();
    EXPECT_GT(busy, 0.0005);
    time.note();
    EXPECT_LT(time.getHistogram().getSum() - busy, busy / 2) << "nothing was done";
    unsigned long long turns = 0;
    for (unsigned long long const count : time.getHistogram().getCounts())
        turns += count;
    EXPECT_EQ(turns, 2u);
}
