// What one call costs while many are up, and what a conference costs that a million have joined and left.
#include "CallScenario.h"
#include "FloorCall.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"

#include <algorithm>
#include <benchmark/benchmark.h>
#include <chrono>
#include <limits>
#include <malloc.h>
#include <memory>
#include <numeric>
#include <random>
#include <span>
#include <vector>

namespace
{
constexpr unsigned int WARM_UP_JOINS = 1000;

/// Cheap to ask, so that it can be asked around each part of a call.
double SECONDS() { return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count(); }

double HEAP_IN_USE() { return static_cast<double>(mallinfo2().uordblks); }

/// A number of calls that are up, and a further one, the last by index, that is not.
class StandingCalls
{
public:
    StandingCalls(unsigned int calls, unsigned int contexts)
        : m_world(contexts), m_left("left", contexts), m_right("right", contexts)
    {
        for (unsigned int i = 0; i < contexts; ++i)
            m_contextNames.push_back(World::CONTEXT_NAME(i));
        for (unsigned int i = 0; i <= calls; ++i)
            m_calls.push_back(std::make_unique<TwoPartyCall>(m_left, m_right));
        for (unsigned int i = 0; i < calls; ++i)
            setUp(i);
        MUST(CC_Call::s_numberOfInstances == calls, "putting the calls up");
    }
    ~StandingCalls()
    {
        for (unsigned int i = 0; i < m_calls.size(); ++i)
            tearDown(i);
        MUST(CC_Call::s_numberOfInstances == 0 && CC_CallLeg::s_numberOfInstances == 0, "taking the calls down");
    }
    StandingCalls(StandingCalls const&) = delete;
    StandingCalls& operator=(StandingCalls const&) = delete;

    void setUp(unsigned int index)
    {
        TwoPartyCall& call = *m_calls[index];
        call.dial(m_contextNames[index % m_contextNames.size()]);
        m_world.settle();
        call.alert();
        m_world.settle();
        call.connect();
        m_world.settle();
    }
    /// Each side changes one property and the other is told. Once for each call: the values are then what they are.
    void changeBothWays(unsigned int index)
    {
        unsigned int const toldBefore = m_left.m_notifications + m_right.m_notifications;
        m_calls[index]->changeCaller(0);
        m_world.settle();
        m_calls[index]->changeCallee(0);
        m_world.settle();
        MUST(m_left.m_notifications + m_right.m_notifications == toldBefore + 2, "telling two changes");
    }
    void tearDown(unsigned int index)
    {
        m_calls[index]->drop();
        m_world.settle();
    }

private:
    World m_world;
    Exchange m_left;
    Exchange m_right;
    std::vector<String> m_contextNames;
    std::vector<std::unique_ptr<TwoPartyCall>> m_calls;
};

/// The memory work of the same calls, which caches and pages slow down as well.
class StandingFloors
{
public:
    StandingFloors(unsigned int calls, unsigned int) : m_calls(calls + 1)
    {
        for (unsigned int i = 0; i < calls; ++i)
            setUp(i);
    }

    void setUp(unsigned int index)
    {
        m_calls[index].dial({});
        for (int state = 0; state < 2; ++state)
            m_calls[index].change(false, m_values[0]);
    }
    void changeBothWays(unsigned int index)
    {
        m_calls[index].change(true, m_values[1]);
        m_calls[index].change(false, m_values[1]);
    }
    void tearDown(unsigned int index) { m_calls[index].drop(); }

private:
    std::string const m_values[2] = {"Ada Lovelace", "A. Lovelace"};
    std::vector<FloorCall> m_calls;
};

/// How long a part of a call takes: the least mean of a hundred times, since whatever else the machine does only adds.
class Part
{
public:
    template <class Work>
    void measure(Work const& work)
    {
        double const begin = SECONDS();
        work();
        m_seconds += SECONDS() - begin;
        if (++m_times == 100)
        {
            m_least = std::min(m_least, m_seconds / m_times);
            m_times = 0;
            m_seconds = 0;
        }
    }
    double getLeast() const { return m_least; }

private:
    unsigned int m_times = 0;
    double m_seconds = 0;
    double m_least = std::numeric_limits<double>::max();
};

struct Parts
{
    Part setUp;
    Part twoChanges;
    Part tearDown;

    void report(benchmark::State& state) const
    {
        state.counters["setup"] = setUp.getLeast();
        state.counters["change"] = twoChanges.getLeast() / 2;
        state.counters["teardown"] = tearDown.getLeast();
    }
};

void FURTHER_CALL(benchmark::State& state)
{
    auto const calls = static_cast<unsigned int>(state.range(0));
    StandingCalls standing(calls, static_cast<unsigned int>(state.range(1)));
    Parts parts;
    for (auto _ : state)
    {
        parts.setUp.measure([&] { standing.setUp(calls); });
        parts.twoChanges.measure([&] { standing.changeBothWays(calls); });
        parts.tearDown.measure([&] { standing.tearDown(calls); });
    }
    parts.report(state);
}

/// In each round a tenth of the calls, so that what is touched again was long ago.
template <class Standing>
void RANDOM_CALL(benchmark::State& state)
{
    auto const calls = static_cast<unsigned int>(state.range(0));
    Standing standing(calls, static_cast<unsigned int>(state.range(1)));
    std::vector<unsigned int> indices(calls);
    std::iota(indices.begin(), indices.end(), 0U);
    std::span const picked(indices.data(), std::max(1U, calls / 10));
    std::mt19937 random(1);
    Parts parts;
    for (auto _ : state)
    {
        std::shuffle(indices.begin(), indices.end(), random);
        for (unsigned int const index : picked)
            parts.twoChanges.measure([&] { standing.changeBothWays(index); });
        for (unsigned int const index : picked)
            parts.tearDown.measure([&] { standing.tearDown(index); });
        for (unsigned int const index : picked)
            parts.setUp.measure([&] { standing.setUp(index); });
    }
    parts.report(state);
}

/// Two parties in a call that guests join and leave.
class Conference
{
public:
    Conference() : m_hosts(m_left, m_right)
    {
        m_hosts.dial();
        m_hosts.alert();
        m_hosts.connect();
        m_world.settle();
    }
    ~Conference()
    {
        m_hosts.drop();
        m_world.settle();
        MUST(CC_Call::s_numberOfInstances == 0 && CC_CallLeg::s_numberOfInstances == 0, "ending the conference");
    }
    Conference(Conference const&) = delete;
    Conference& operator=(Conference const&) = delete;

    std::unique_ptr<CC_CallAdapterE164> makeGuest()
    {
        auto guest = std::make_unique<CC_CallAdapterE164>();
        MUST(guest->setup("guest", m_guests, &m_guests), "setup");
        return guest;
    }
    void joinAndLeave(CC_CallAdapterE164& guest, bool isSettled)
    {
        MUST(guest.accept(*m_hosts.m_caller.getCall(), "4930456", QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN,
                          QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "Grace"),
             "accept");
        settleIf(isSettled);
        MUST(guest.getPeerE164() == m_hosts.m_caller.getOwnE164() ||
                 guest.getPeerE164() == m_hosts.m_callee.getOwnE164(),
             "seeing another party");
        guest.drop(QCause::NORMAL_CALL_CLEARING, 0);
        settleIf(isSettled);
    }
    void settle()
    {
        m_world.settle();
        MUST(m_hosts.m_caller.getCall()->getNumberOfCallLegs() == 2, "leaving");
    }

private:
    void settleIf(bool isSettled)
    {
        if (isSettled)
            m_world.settle();
    }

    World m_world;
    Exchange m_left{"left"};
    Exchange m_right{"right"};
    Exchange m_guests{"guests"};
    TwoPartyCall m_hosts;
};

/// Has one guest after the other join by `joinNext()`.
template <class JoinNext>
void MEASURE_JOINS(benchmark::State& state, Conference& conference, JoinNext const& joinNext)
{
    auto const joins = static_cast<std::size_t>(state.max_iterations);
    for (std::size_t i = 0; i < WARM_UP_JOINS; ++i)
        joinNext();
    conference.settle();

    double const heapBefore = HEAP_IN_USE();
    std::size_t done = 0;
    Part first;
    Part middle;
    Part last;
    for (auto _ : state)
    {
        (done < joins / 10 ? first : done < joins - joins / 10 ? middle : last).measure(joinNext);
        ++done;
    }
    conference.settle();
    state.counters["first"] = first.getLeast();
    state.counters["last"] = last.getLeast();
    state.counters["bytesLeft"] = HEAP_IN_USE() - heapBefore;
}

/// The same three guests in turn.
void JOIN_AGAIN(benchmark::State& state, unsigned int joinsInATurn)
{
    Conference conference;
    std::unique_ptr<CC_CallAdapterE164> const guests[] = {conference.makeGuest(), conference.makeGuest(),
                                                          conference.makeGuest()};
    unsigned int joins = 0;
    MEASURE_JOINS(state, conference,
                  [&]
                  {
                      conference.joinAndLeave(*guests[joins % 3], joinsInATurn == 1);
                      if (++joins % joinsInATurn == 0)
                          conference.settle();
                  });
}

void JOIN_NEW(benchmark::State& state)
{
    Conference conference;
    MEASURE_JOINS(state, conference, [&] { conference.joinAndLeave(*conference.makeGuest(), true); });
}

void JOIN_KEPT(benchmark::State& state)
{
    Conference conference;
    std::vector<std::unique_ptr<CC_CallAdapterE164>> guests(static_cast<std::size_t>(state.max_iterations) +
                                                            WARM_UP_JOINS);
    for (auto& guest : guests)
        guest = conference.makeGuest();
    auto next = guests.begin();
    MEASURE_JOINS(state, conference, [&] { conference.joinAndLeave(**next++, true); });
}

void ONCE(benchmark::internal::Benchmark* benchmark) { benchmark->Repetitions(1)->Unit(benchmark::kMicrosecond); }
void SIZES(benchmark::internal::Benchmark* benchmark)
{
    for (long const calls : {1, 100, 10000, 100000})
        benchmark->Args({calls, 1});
}
void CONTEXTS(benchmark::internal::Benchmark* benchmark) { benchmark->Args({10000, 10})->Args({10000, 100}); }

BENCHMARK(FURTHER_CALL)->Name("Scale/FurtherCall")->Apply(ONCE)->Apply(SIZES)->Apply(CONTEXTS)->Iterations(20000);
BENCHMARK(RANDOM_CALL<StandingCalls>)
    ->Name("Scale/RandomCall")
    ->Apply(ONCE)
    ->Apply(SIZES)
    ->Apply(CONTEXTS)
    ->MinTime(0.5);
BENCHMARK(RANDOM_CALL<StandingFloors>)->Name("Scale/RandomFloor")->Apply(ONCE)->Apply(SIZES)->MinTime(0.5);
BENCHMARK_CAPTURE(JOIN_AGAIN, settled, 1)->Name("Scale/JoinSettled")->Apply(ONCE)->Iterations(1000000);
BENCHMARK_CAPTURE(JOIN_AGAIN, batched, 100)->Name("Scale/JoinBatched")->Apply(ONCE)->Iterations(1000000);
BENCHMARK(JOIN_NEW)->Name("Scale/JoinNew")->Apply(ONCE)->Iterations(100000);
BENCHMARK(JOIN_KEPT)->Name("Scale/JoinKept")->Apply(ONCE)->Iterations(5000);
} // namespace
