// What calls and their parts cost in time, on the machine that it runs on:
// callcontrol_bench [GOOGLE BENCHMARK'S OPTIONS]
//
// A baseline runs in the same process and does the same work on the same values, so that a ratio to it says something
// where the figure alone does not. What is measured is checked to have happened; a step that fails ends the program.
//
//   WholeCall/plain             dial, offer, accept, alert, connect, ten changes each way, drop, deferred clean-up;
//                               E.164 adapters on both sides, the loop run after every step
//   WholeCall/filters           the same with two input and two output filters at each end
//   WholeCall/transfer          two such calls, connected with each other before they are dropped
//   WholeCall/conference        two such calls made one of three legs before they are dropped
//   WholeCall/floor/1, /2       baseline: the memory work that one call and two calls cannot avoid (FloorCall)
//
//   Delivery/...                one event to 1, 4 and 16 observers; time is per event. CC_ObserverContainer; baselines:
//                               vector (of pointers, a virtual call each), signals2 (Boost, unlocked), sigc (libsigc++)
//
//   Event/PostAndRun/...        a thread-safe post and the turn that runs it. TYEvent; TYEventPollFd (a loop inside
//                               another one, which it wakes through a descriptor); baselines: libuv (which always
//                               does), asio (Boost, with a flag against posting twice)
//   Event/PostPending/...       a post of what is pending already
//   Event/EightPostsOneRun/...  eight posts and the turn that runs them as one
//
//   Container/LookUp/...        twelve properties of a calling party: each found once by its id. CC_PropertyContainer;
//                               baselines: std::map and std::unordered_map of id -> variant of number and string
//   Container/Replace/...       each found, compared and, since it differs, replaced
//   Container/Keep/...          each found and compared, nothing replaced
//   Container/Copy/...          all copied, and the copy freed
//
//   Log/...                     a log line whose level is off. Monitor; baselines: nothing (an empty turn of the
//                               measuring loop), spdlog
//
//   Scale/FurtherCall/N/C       a further call with N calls up, spread over C contexts; set-up, property change and
//                               teardown are in the counters
//   Scale/RandomCall/N/C        the same of calls picked from those N at random, which no cache holds when N is large;
//                               time is per round of a tenth of them
//   Scale/RandomFloor/N/1       baseline: the same with FloorCalls
//   Scale/Join...               joining and leaving one conference. In the counters what a join costs in the first and
//                               in the last tenth of them, and the bytes that all have left on the heap. JoinSettled:
//                               the same three adapters in turn, the loop run after every step; JoinBatched: the loop
//                               run after every hundredth; JoinNew: an adapter made for each join and deleted after it;
//                               JoinKept: each time another adapter, all of which live on
//
//   Records/Encode, Decode      one realistic Charge, Tariff and QoS record to DER and back
//
// Of the repetitions the console shows the fastest, since whatever else the machine does only adds; a file written with
// --benchmark_out has them all. On a busy machine --benchmark_enable_random_interleaving=true keeps a burst of other
// work from hitting one side of a comparison alone. Debian's Google Benchmark warns of having been built as a debug
// library; what it has inside the measuring loops is compiled here.
#include <algorithm>
#include <benchmark/benchmark.h>
#include <future>
#include <limits>
#include <malloc.h>
#include <thread>
#include <vector>

namespace
{
class FastestReporter : public benchmark::ConsoleReporter
{
public:
    FastestReporter() : ConsoleReporter(OO_None) {} // one header above all counters

    void ReportRuns(std::vector<Run> const& runs) override
    {
        if (runs.empty() || runs.front().run_type == Run::RT_Aggregate)
            return;
        ConsoleReporter::ReportRuns({*std::min_element(
            runs.begin(), runs.end(),
            [](Run const& left, Run const& right) { return left.GetAdjustedCPUTime() < right.GetAdjustedCPUTime(); })});
    }
};

/// A gateway has several threads: with a single one the C library takes locks without atomic operations.
class SecondThread
{
public:
    SecondThread() : m_thread([end = m_end.get_future()] { end.wait(); }) {}
    ~SecondThread()
    {
        m_end.set_value();
        m_thread.join();
    }

private:
    std::promise<void> m_end;
    std::thread m_thread;
};
} // namespace

int main(int argc, char** argv)
{
    char repetitions[] = "--benchmark_repetitions=7"; // may be overridden by the caller's, which come later
    char minTime[] = "--benchmark_min_time=0.1";
    std::vector<char*> arguments = {argv[0], repetitions, minTime};
    arguments.insert(arguments.end(), argv + 1, argv + argc);
    int number = static_cast<int>(arguments.size());
    benchmark::Initialize(&number, arguments.data());
    if (benchmark::ReportUnrecognizedArguments(number, arguments.data()))
        return 1;

    // memory once had is kept: calls are measured, not the system handing out pages
    mallopt(M_TRIM_THRESHOLD, std::numeric_limits<int>::max());
    mallopt(M_MMAP_MAX, 0);
    SecondThread const second;
    FastestReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
}
