#pragma once

#include "tests/simulation/Operation.h"
#include "tests/simulation/World.h"

#include <cstddef>

namespace Simulation
{
/// Carries operations out on a world. Whatever one of them means that is not there, or must not be done where it
/// stands, it leaves out.
class Interpreter
{
public:
    /// Of an operation without a result, or that was left out.
    static constexpr unsigned int NO_RESULT = 0xfffffffe;

    Interpreter(World& world, Operations const& operations);

    /// The operation at that place of the stream; what stands behind a reaction's announcement belongs to it. The place
    /// of the one that comes next.
    std::size_t carryOut(std::size_t place, std::size_t end);
    /// What the last operation gave.
    unsigned int getResult() const { return m_result; }
    unsigned long getNumberOfOperations() const { return m_count; }

private:
    void carryOutAll(std::size_t begin, std::size_t end);
    std::size_t announce(std::size_t place, std::size_t end);
    void perform(Operation const& operation);
    void failAllocation(unsigned int n);

    void turn(unsigned int turns);
    XCode dial(Operation const& operation);
    XCode accept(Operation const& operation);
    void reject(Operation const& operation);
    void answerHeld(Operation const& operation);
    XCode offer(Operation const& operation);
    XCode setOfAdapter(Operation const& operation);
    XCode setOfLeg(Operation const& operation);
    XCode setOnCall(Operation const& operation);
    void changeUntold(Operation const& operation);
    void read(Operation const& operation);
    void accessor(Operation const& operation);
    void service(CC_CallAdapter* adapter, CC_CallLeg* leg, unsigned int which, unsigned int text);
    XCode transfer(Operation const& operation);
    void setup(Operation const& operation);
    void destroyAdapter(unsigned int line);
    void acquire(Operation const& operation);
    void newLeg(Operation const& operation);
    XCode moveLeg(Operation const& operation);
    XCode transferLeg(unsigned int number, CC_CallLeg& leg, CC_Call* to);
    void newCall(Operation const& operation);
    void emptyCall(Operation const& operation);
    void cleanUpWithoutGuests(CC_Call& call);
    void changeFilters(Operation const& operation);
    void useFilters(Operation const& operation);
    void observe(Operation const& operation, int change);
    void observeCall(Guest& guest, CC_Call& call, int change);
    void observeOther(Operation const& operation, Guest& guest, int change);
    void otherThread(Operation const& operation);
    void dump(Operation const& operation);
    void setOptions(Operation const& operation);
    void settle();
    void release(Operation const& operation);

    World& m_world;
    Operations const& m_operations;
    unsigned int m_result = NO_RESULT;
    unsigned long m_count = 0;
    bool m_isToFail = false;
};
} // namespace Simulation
