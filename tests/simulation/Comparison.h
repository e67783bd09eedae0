#pragma once

#include "tests/simulation/Model.h"

#include <string>
#include <vector>

class CC_Call;
class CC_CallAdapter;
class CC_CallLeg;
class CC_PropertyContainer;

namespace Simulation
{
class World;

/// Compares what is with what the model predicts, after each operation: results, who heard what in which order, calls
/// and legs with all that they hold, peers and views. The first difference fails the run.
class Comparison
{
public:
    explicit Comparison(World& world);
    void after(Operation const& operation, unsigned int result);

private:
    bool isPredicted() const;
    void compareResult(Operation const& operation, unsigned int predicted, unsigned int result);
    void compareHeard();
    void compareContexts();
    void compareLines();
    void compareGuestLegs();
    void compareFound();
    void compareStatistics();
    void compareViews();
    void bindCall(std::string const& what, int predicted, CC_Call const* real);
    void bindLeg(std::string const& what, int predicted, CC_CallLeg const* real);
    void compareCall(int predicted, CC_Call const& real);
    void compareLeg(int predicted, CC_CallLeg const& real);
    void compareContents(std::string const& what, Model::Container const& predicted, CC_PropertyContainer const& real);
    void compareView(std::string const& what, Model::Container const& predicted, CC_CallAdapter const& adapter,
                     unsigned int which);
    void differ(std::string const& what);

    World& m_world;
    Model m_model;
    std::vector<CC_Call const*> m_calls; // by their numbers in the model
    std::vector<CC_CallLeg const*> m_legs;
    std::vector<int> m_foundCalls;
    std::vector<int> m_foundLegs;
    unsigned int m_callsBefore;
    unsigned int m_legsBefore;
    unsigned long long m_timeBefore;
    std::string m_operation;
};
} // namespace Simulation
