// An event told to observers: the list of call control beside other ways to keep listeners.
#include "CallScenario.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_CallLegObserver.h"
#include "calls/CC_ObserverContainer.h"

#include <benchmark/benchmark.h>
#include <boost/signals2/dummy_mutex.hpp>
#include <boost/signals2/signal.hpp>
#include <boost/signals2/signal_type.hpp>
#include <memory>
#include <sigc++/sigc++.h>
#include <vector>

namespace
{
using LegEvent = CC_Event<CC_CallLeg>;

class Listener : public CC_CallLegObserver
{
public:
    void onCallLegObservationEnded(LegEvent const&) override {}
    void onCallLegCallRelinked(LegEvent const&) override {}
    void onCallLegPropertyChanged(LegEvent const&) override { ++m_told; }
    void onCallLegSynchronousService(LegEvent const&) override {}

    unsigned long m_told = 0;
};

/// Never told. Without it the compiler guesses whom a virtual call reaches and makes it a direct one.
class OtherListener : public Listener
{
public:
    void onCallLegPropertyChanged(LegEvent const&) override { m_told += 2; }
};

struct Counted
{
    void add(CC_CallLegObserver& observer) { MUST(m_observers.addObserver(&observer), "addObserver"); }
    void tell(LegEvent const& event)
    {
        m_observers.broadcastEvent(event, &CC_CallLegObserver::onCallLegPropertyChanged);
    }
    CC_ObserverContainer<CC_CallLegObserver, CC_CallLeg> m_observers;
};

struct Vector
{
    void add(CC_CallLegObserver& observer) { m_observers.push_back(&observer); }
    void tell(LegEvent const& event)
    {
        for (CC_CallLegObserver* const observer : m_observers)
            observer->onCallLegPropertyChanged(event);
    }
    std::vector<CC_CallLegObserver*> m_observers;
};

struct Signals2
{
    void add(CC_CallLegObserver& observer)
    {
        m_signal.connect([&observer](LegEvent const& event) { observer.onCallLegPropertyChanged(event); });
    }
    void tell(LegEvent const& event) { m_signal(event); }
    boost::signals2::signal_type<void(LegEvent const&),
                                 boost::signals2::keywords::mutex_type<boost::signals2::dummy_mutex>>::type m_signal;
};

struct Sigc
{
    void add(CC_CallLegObserver& observer)
    {
        m_signal.connect(sigc::mem_fun(observer, &CC_CallLegObserver::onCallLegPropertyChanged));
    }
    void tell(LegEvent const& event) { m_signal.emit(event); }
    sigc::signal<void(LegEvent const&)> m_signal;
};

std::unique_ptr<Listener> MAKE_LISTENER()
{
    bool isOther = false;
    benchmark::DoNotOptimize(isOther);
    return isOther ? std::make_unique<OtherListener>() : std::make_unique<Listener>();
}

/// A function of its own, as delivery is in a call leg, and aligned: else its speed would change from build to build.
template <class Observers>
__attribute__((noinline, aligned(64))) void TELL(Observers& observers, LegEvent const& event)
{
    observers.tell(event);
}

template <class Observers>
void DELIVER(benchmark::State& state)
{
    auto* const leg = new CC_CallLeg;
    CC_EvCallLegPropertyChanged const event(*leg, CC_Flags());
    std::vector<std::unique_ptr<Listener>> listeners;
    Observers observers;
    for (long i = 0; i < state.range(0); ++i)
    {
        listeners.push_back(MAKE_LISTENER());
        observers.add(*listeners.back());
    }
    for (auto _ : state)
        TELL(observers, event);
    for (auto const& listener : listeners)
        MUST(listener->m_told == static_cast<unsigned long>(state.iterations()), "telling every observer once");
    state.SetItemsProcessed(state.iterations() * state.range(0));
    leg->removeReference();
}

void NUMBERS(benchmark::internal::Benchmark* benchmark) { benchmark->Arg(1)->Arg(4)->Arg(16); }

BENCHMARK(DELIVER<Vector>)->Name("Delivery/vector")->Apply(NUMBERS);
BENCHMARK(DELIVER<Counted>)->Name("Delivery/CC_ObserverContainer")->Apply(NUMBERS);
BENCHMARK(DELIVER<Signals2>)->Name("Delivery/signals2")->Apply(NUMBERS);
BENCHMARK(DELIVER<Sigc>)->Name("Delivery/sigc")->Apply(NUMBERS);
} // namespace
