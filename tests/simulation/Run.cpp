#include "tests/simulation/Run.h"

#include "platform/base/TYRecycled.h"
#include "properties/CC_Factory.h"
#include "tests/simulation/Comparison.h"
#include "tests/simulation/Interpreter.h"
#include "tests/simulation/Invariants.h"
#include "tests/simulation/Values.h"

namespace Simulation
{
namespace
{
/// What is alive of everything that is counted.
struct Left
{
    LeakCheck const counts;
    unsigned int media = MediaContext::s_numberOfInstances;
    long blocks = Memory::NUMBER_OF_BLOCKS();
};

std::string WHAT_IS_LEFT(Left const& before)
{
    long const blocks = Memory::NUMBER_OF_BLOCKS() - before.blocks;
    std::string const counts = before.counts.compare();
    if (!counts.empty())
        return "left over: " + counts;
    if (MediaContext::s_numberOfInstances != before.media)
        return "left over: media contexts";
    if (blocks != 0)
        return "left over: " + std::to_string(blocks) + " blocks of memory";
    return {};
}

/// The world with its operations; what it heard and predicted goes with it.
void CARRY_OUT(Operations const& operations, std::atomic<std::size_t>* progress, Outcome& outcome, bool& mayLeave)
{
    World world(operations.front());
    Interpreter interpreter(world, operations);
    Comparison comparison(world);
    for (std::size_t place = 1; place < operations.size() && !world.hasFailed();)
    {
        if (progress != nullptr)
            *progress = place;
        std::size_t const next = interpreter.carryOut(place, operations.size());
        comparison.after(operations[place], interpreter.getResult());
        CHECK_AFTER_OPERATION(world);
        if (operations[place].code == Code::SETTLE)
            CHECK_AT_REST(world);
        place = next;
    }
    if (progress != nullptr)
        *progress = operations.size();
    if (!world.hasFailed())
        CHECK_AT_THE_END(world);
    world.takeDown();
    outcome.operations = interpreter.getNumberOfOperations();
    outcome.failure = world.getFailure();
    mayLeave = world.m_hasFailingFilter && world.m_hasLostContext;
}
} // namespace

Outcome RUN(Operations const& operations, std::atomic<std::size_t>* progress)
{
    Outcome outcome;
    if (operations.empty())
        return outcome;
    outcome.failure.reserve(4096);
    TYRecycled::KEEP_BLOCKS(0);
    Left const before;
    bool mayLeave = false;
    CARRY_OUT(operations, progress, outcome, mayLeave);
    TYRecycled::KEEP_BLOCKS(0);
    if (!outcome.hasFailed() && !mayLeave)
        outcome.failure = WHAT_IS_LEFT(before);
    return outcome;
}

void PREPARE_RUNS()
{
    static CC_Factory s_factory;
    TYRecycled::KEEP_BLOCKS(0);
    std::ignore = CallControl::ADD_PROPERTY_FACTORY(&s_factory);
    Values::PREPARE();
    for (unsigned int which = 0; which < 64; ++which) // each class takes its type number
        Values::WITH(Values::CHOOSE(which, 0), [](CC_Property const& property) { std::ignore = property.getTypeId(); });
    Operations everything;
    for (unsigned int code = 0; code < static_cast<unsigned int>(Code::NUMBER_OF_CODES); ++code)
        if (static_cast<Code>(code) != Code::FAIL_ALLOCATION)
            everything.push_back({static_cast<Code>(code), {}});
    std::ignore = RUN(everything);
    std::ignore = RUN({{Code::WORLD, {}}, {Code::KEEP_BLOCKS, {1}}, {Code::NEW_LEG, {}}});
}
} // namespace Simulation
