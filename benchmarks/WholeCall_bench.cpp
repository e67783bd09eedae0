// Whole calls, and the floor under them.
#include "CallScenario.h"
#include "FloorCall.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"

#include <benchmark/benchmark.h>

namespace
{
/// Three modules of networks of their own; with filters each has two for either direction.
class Exchanges
{
public:
    explicit Exchanges(bool withFilters)
    {
        for (int i = 0; i < 2; ++i)
            MUST(m_filters.addFilter(PrefixFilter()), "addFilter");
        for (Exchange* const exchange : {&m_left, &m_middle, &m_right})
        {
            exchange->setInputFilterContainer(withFilters ? &m_filters : nullptr);
            exchange->setOutputFilterContainer(withFilters ? &m_filters : nullptr);
        }
    }

    unsigned long getNumberOfNotifications() const
    {
        return m_left.m_notifications + m_middle.m_notifications + m_right.m_notifications;
    }

    World m_world;
    CC_PropertyFilterContainer m_filters;
    Exchange m_left{"left"};
    Exchange m_middle{"middle"};
    Exchange m_right{"right"};
};

/// The first call warms the memory up, and shows how often the modules are to be told of something in every other one.
template <class OneCall>
void MEASURE(benchmark::State& state, Exchanges const& exchanges, OneCall const& oneCall)
{
    oneCall();
    unsigned long const told = exchanges.getNumberOfNotifications();
    MUST(told >= 2 * TwoPartyCall::CHANGES_EACH_WAY, "telling the changes");
    for (auto _ : state)
        oneCall();
    MUST(exchanges.getNumberOfNotifications() == told * (static_cast<unsigned long>(state.iterations()) + 1),
         "telling every call's changes");
    MUST(CallControl::GET_NUMBER_OF_CALLS("SWITCH") == 0 && CC_CallLeg::s_numberOfInstances == 0, "cleaning up");
}

void TWO_PARTIES(benchmark::State& state, bool withFilters)
{
    Exchanges exchanges(withFilters);
    TwoPartyCall call(exchanges.m_left, exchanges.m_right);
    MEASURE(state, exchanges,
            [&]
            {
                call.talk(exchanges.m_world);
                call.hangUp(exchanges.m_world);
            });
}

/// The called party of one call puts it together with the one that it has placed itself.
void THREE_PARTIES(benchmark::State& state, bool isConference)
{
    Exchanges exchanges(false);
    TwoPartyCall first(exchanges.m_left, exchanges.m_middle);
    TwoPartyCall second(exchanges.m_middle, exchanges.m_right);
    MEASURE(state, exchanges,
            [&]
            {
                first.talk(exchanges.m_world);
                second.talk(exchanges.m_world);
                CC_Call const* const kept = first.m_caller.getCall();
                MUST(first.m_callee.transfer(second.m_caller, !isConference), "transfer");
                exchanges.m_world.settle();
                MUST(second.m_callee.getCall() == kept && kept->getNumberOfCallLegs() == (isConference ? 3 : 2),
                     "bringing the parties together");
                first.hangUp(exchanges.m_world);
                second.hangUp(exchanges.m_world);
            });
}

void FLOOR(benchmark::State& state)
{
    for (auto _ : state)
        for (long i = 0; i < state.range(0); ++i)
            FloorCall::RUN();
}

BENCHMARK(FLOOR)->Name("WholeCall/floor")->Arg(1)->Arg(2);
BENCHMARK_CAPTURE(TWO_PARTIES, plain, false)->Name("WholeCall/plain");
BENCHMARK_CAPTURE(TWO_PARTIES, filters, true)->Name("WholeCall/filters");
BENCHMARK_CAPTURE(THREE_PARTIES, transfer, false)->Name("WholeCall/transfer");
BENCHMARK_CAPTURE(THREE_PARTIES, conference, true)->Name("WholeCall/conference");
} // namespace
