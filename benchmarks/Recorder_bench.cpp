// What it costs to record: a leg's change with and without, nobody observing, and a record alone (a leg's name).
#include "CallScenario.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "recorder/CC_Recorder.h"

#include <benchmark/benchmark.h>

namespace
{
class RecordedLeg
{
public:
    explicit RecordedLeg(bool isRecorded)
    {
        if (isRecorded)
            MUST(CC_Recorder::START(), "start of the recorder");
    }
    ~RecordedLeg()
    {
        m_leg->removeReference();
        CC_Recorder::CLOSE();
    }
    CC_CallLeg& get() { return *m_leg; }

private:
    World m_world;
    CC_CallLeg* m_leg = new CC_CallLeg;
};

void CHANGE(benchmark::State& state, bool isRecorded)
{
    RecordedLeg leg(isRecorded);
    CC_PropertyString const names[] = {CC_PropertyString(CC_PropertyId::NAME, "Ada Lovelace"),
                                       CC_PropertyString(CC_PropertyId::NAME, "A. Lovelace")};
    unsigned int round = 0;
    for (auto _ : state)
        MUST(leg.get().setProperty(names[++round % 2]), "setProperty");
}

void NAME(benchmark::State& state, bool isRecorded)
{
    RecordedLeg leg(isRecorded);
    String const name = "trunk/9";
    for (auto _ : state)
        MUST(leg.get().setName(name), "setName");
}

BENCHMARK_CAPTURE(CHANGE, unrecorded, false)->Name("Recorder/change/off");
BENCHMARK_CAPTURE(CHANGE, recorded, true)->Name("Recorder/change/on");
BENCHMARK_CAPTURE(NAME, unrecorded, false)->Name("Recorder/text/off");
BENCHMARK_CAPTURE(NAME, recorded, true)->Name("Recorder/text/on");
} // namespace
