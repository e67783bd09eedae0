// What a call costs, step by step, with a number of calls up: call_cost [CALLS]
//
// The figures are exact, so one call is measured, when everything in it has run once before. Its set-up comes when all
// others are up; then half of these are cleared and set up again, so that what follows is done with a call amid them.
// `./run cost` runs this program under callgrind and compares what it prints with budget.json.
#include "CallScenario.h"
#include "FloorCall.h"
#include "Steps.h"
#include "platform/base/TYRecycled.h"
#include "properties/CC_Property.h"
#include "recorder/CC_Recorder.h"
#include "testing/DrivenClock.h"

#include <cstdio>
#include <cstdlib>
#include <malloc.h>
#include <memory>
#include <vector>

namespace
{
/// The modules of a call's two sides. They are two, since a call of one network with itself is looked at more closely.
struct Modules
{
    explicit Modules(char const* name, CC_PropertyFilterContainer* filters = nullptr, Exchange::OnStep onStep = nullptr)
        : left(String("left-") + name, 1, filters, filters, onStep)
        , right(String("right-") + name, 1, filters, filters, onStep)
    {
    }
    Exchange left;
    Exchange right;
};

/// The calls that are up besides the one that is measured.
class OtherCalls
{
public:
    OtherCalls(World& world, Modules& modules, unsigned long number) : m_world(world), m_modules(modules)
    {
        m_calls.resize(number);
        std::size_t const bytesBefore = HEAP_IN_USE();
        unsigned int const propertiesBefore = CC_Property::s_numberOfInstances;
        setUp(0, number);
        m_bytes = HEAP_IN_USE() - bytesBefore;
        m_properties = CC_Property::s_numberOfInstances - propertiesBefore;
    }
    void renewHalf()
    {
        for (unsigned long i = 0; i < m_calls.size() / 2; ++i)
            m_calls[i].reset();
        m_world.settle();
        setUp(0, m_calls.size() / 2);
    }
    std::size_t getBytesOfOne() const { return m_bytes / m_calls.size(); }
    unsigned long getPropertiesOfOne() const { return m_properties / m_calls.size(); }

private:
    static std::size_t HEAP_IN_USE() { return mallinfo2().uordblks; }

    void setUp(unsigned long from, unsigned long to)
    {
        for (unsigned long i = from; i < to; ++i)
        {
            m_calls[i] = std::make_unique<TwoPartyCall>(m_modules.left, m_modules.right);
            m_calls[i]->dial();
            m_calls[i]->connect();
            m_world.settle();
        }
    }

    World& m_world;
    Modules& m_modules;
    std::vector<std::unique_ptr<TwoPartyCall>> m_calls;
    std::size_t m_bytes = 0;
    unsigned long m_properties = 0;
};

void SET_UP(World& world, TwoPartyCall& call)
{
    Steps::begin("dial"); // which becomes "offer" and "accept" and comes back
    call.dial();
    Steps::end();
    world.settle();
    Steps::begin("alert");
    call.alert();
    Steps::end();
    world.settle();
    Steps::begin("connect");
    call.connect();
    Steps::end();
    world.settle();
}

void CHANGE(World& world, TwoPartyCall& call)
{
    call.changeCaller(0);
    world.settle();
    Steps::begin("property change");
    call.changeCaller(1);
    Steps::begin("notification");
    world.settle();
    Steps::end();
}

void CLEAR(World& world, TwoPartyCall& call)
{
    Steps::begin("drop");
    call.drop();
    Steps::begin("clean-up");
    world.settle();
    Steps::end();
}

void MEASURE_STEPS(World& world, Modules& modules, OtherCalls& others)
{
    TwoPartyCall call(modules.left, modules.right);
    SET_UP(world, call);
    others.renewHalf();
    CHANGE(world, call);
    CLEAR(world, call);
}

/// The called sides of two calls are connected with each other, or all but one of the legs brought into one call.
void MEASURE_TRANSFER(char const* step, World& world, Modules& modules, bool isConference)
{
    {
        TwoPartyCall first(modules.left, modules.right);
        TwoPartyCall second(modules.left, modules.right);
        for (TwoPartyCall* const call : {&first, &second})
        {
            call->dial();
            call->connect();
        }
        world.settle();
        Steps::begin(step);
        MUST(first.m_caller.transfer(second.m_caller, !isConference), "transfer");
        Steps::end();
        world.settle();
    }
    world.settle(); // or what is measured next would clean up after these
}

void MEASURE_FLOOR()
{
    Steps::begin("floor");
    FloorCall::RUN();
    Steps::end();
}

void MEASURE_WHOLE_CALL(char const* step, World& world, Modules& modules)
{
    TwoPartyCall call(modules.left, modules.right);
    Steps::begin(step);
    call.talk(world);
    call.hangUp(world);
    Steps::end();
}
} // namespace

int main(int argc, char** argv)
{
    unsigned long const calls = argc > 1 ? std::strtoul(argv[1], nullptr, 10) : 1;
    if (calls == 0)
    {
        std::fprintf(stderr, "usage: call_cost [CALLS]\n");
        return 2;
    }
    DrivenClock const clock; // reading a real one costs now more, now less
    World world;
    Modules plain("1");
    Modules stepwise("2", nullptr, &Steps::next);
    CC_PropertyFilterContainer twoFilters;
    CC_PropertyFilterContainer twoWritingFilters;
    for (int i = 0; i < 2; ++i)
    {
        MUST(twoFilters.addFilter(PrefixFilter()), "addFilter");
        MUST(twoWritingFilters.addFilter(WritingPrefixFilter()), "addFilter");
    }
    Modules filtering("3", &twoFilters);
    Modules writing("4", &twoWritingFilters);

    OtherCalls others(world, plain, calls);
    for (int i = 0; i < 2; ++i)
    {
        MEASURE_STEPS(world, stepwise, others);
        MEASURE_TRANSFER("transfer", world, plain, false);
        MEASURE_TRANSFER("conference", world, plain, true);
        MEASURE_WHOLE_CALL("whole call", world, plain);
        MEASURE_WHOLE_CALL("whole call, two filters at each end", world, filtering);
        MEASURE_WHOLE_CALL("whole call, two filters at each end that write", world, writing);
        MUST(CC_Recorder::START(), "start of the recorder");
        MEASURE_WHOLE_CALL("whole call, recorded", world, plain);
        MEASURE_WHOLE_CALL("whole call, two filters at each end, recorded", world, filtering);
        CC_Recorder::CLOSE();
        MEASURE_FLOOR();
        Steps::begin("nothing"); // what a mark itself costs
        Steps::end();
        Steps::arm();
    }
    TYRecycled::KEEP_BLOCKS(0);
    MEASURE_WHOLE_CALL("whole call, no memory kept", world, plain);
    Steps::print();
    std::printf("resident octets\t%zu\nstored properties\t%lu\n", others.getBytesOfOne(), others.getPropertiesOfOne());
    return 0;
}
