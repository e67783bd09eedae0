#pragma once

#include "testing/CallControlFixture.h"
#include "testing/ConformanceLadder.h"
#include "testing/ConformanceWatch.h"
#include "testing/FakeModule.h"
#include "testing/ModuleConformance.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// A rule that was found broken, on its way to who runs the case.
struct ConformanceFailure
{
    ModuleConformance::Rule const* rule;
    std::string what;
};

/// The driver says that the case cannot be tried.
struct ConformanceSkip
{
    std::string why;
};

/// What a conformance case works with: call control, the module behind its driver, the scripted party that is called or
/// calls, and the steps in which a call comes up and ends. A step that the module does not follow throws a
/// ConformanceFailure with the rule that this step is about.
class ConformanceSituation
{
public:
    using Rule = ModuleConformance::Rule;
    using Seen = ModuleDriver::Seen;
    using State = CC_PropertyCallLegState;

    enum class Caller
    {
        WIRE,
        PEER
    };
    enum class Step
    {
        OFFERED,
        RINGING,
        CONNECTED
    };

    explicit ConformanceSituation(ModuleConformance::Factory const& makeDriver);
    ~ConformanceSituation();

    /// Throws ConformanceSkip when the module cannot do it.
    void need(ModuleDriver::Ability ability) const;
    void need(Caller caller) const;
    /// From the beginning, with a new module and new parties.
    void restart();
    /// Forgets what was seen in the call before.
    void beginCall();

    // --- steps of a call ---------------------------------------------------------------------------------------------

    /// Brings a call as far as that; everything has settled then.
    void call(Caller caller, Step step);
    void offer(Caller caller);
    void ring(Caller caller);
    void answer(Caller caller);
    /// Peer's and wire's clearing, and what has to follow: the other side cleared, the module's leg dropped, nothing
    /// left. It breaks `whenNotTold` when the end does not reach the other side.
    void clearFromPeer(QCause cause, Rule const& whenNotTold);
    void clearFromWire(QCause cause, Rule const& whenNotTold);
    /// The peer hangs up a call that is up, and all is as it has to be.
    void endAsUsual() { clearFromPeer(QCause::NORMAL_CALL_CLEARING, ModuleConformance::CLEARS_THE_WIRE_ONCE); }

    // --- what is found -----------------------------------------------------------------------------------------------

    void expect(Rule const& rule, bool isKept, std::string const& what) const;
    /// `isDone` within the time that the driver gives.
    void await(Rule const& rule, std::function<bool()> const& isDone, std::string const& what);
    void settle();

    /// What the wire has seen in this call.
    unsigned int count(Seen::What what) const;
    Seen const* find(Seen::What what) const;
    /// The wire is cleared, once, and sees nothing after that.
    void expectWireCleared(Rule const& whenNot);
    void expectWireNotCleared(Rule const& rule) const;
    /// The module's legs are dropped, and when the others have hung up nothing is left of legs and calls.
    void expectDropped(Rule const& whenNot);
    void hangUpOthers();
    bool isModulesLegOver() const;
    bool isEverythingGone() const;
    std::string whatIsLeft() const;
    /// Its leg in a call; null when there is none.
    CC_CallLeg* findLegOf(FakeModule const& party) const;

    /// Writes down what the case does.
    void did(ConformanceLadder::Column column, std::string const& what);

    ModuleDriver& driver() const { return *m_parts->driver; }
    FakeModule& peer() const { return *m_parts->peer; }
    /// Other parties, made when they are asked for.
    FakeModule& second() const { return party(m_parts->second, "second"); }
    FakeModule& third() const { return party(m_parts->third, "third"); }
    CallControlFixture& callControl() const { return m_parts->callControl; }
    ConformanceWatch& watch() const { return *m_parts->watch; }
    String const& numberDialled() const { return m_parts->numberDialled; }
    std::string const& digitsHeard() const { return m_parts->digitsHeard; }
    ConformanceLadder const& ladder() const { return m_ladder; }
    /// Ends the module; the parties stay.
    void destroyModule() { m_parts->driver.reset(); }

private:
    struct Parts
    {
        CallControlFixture callControl;
        std::unique_ptr<ConformanceWatch> watch;
        std::unique_ptr<FakeModule> peer;
        std::unique_ptr<FakeModule> second;
        std::unique_ptr<FakeModule> third;
        String numberDialled;
        std::string digitsHeard;
        std::unique_ptr<ModuleDriver> driver; // the first to go
    };

    FakeModule& party(std::unique_ptr<FakeModule>& party, char const* name) const;
    void makePeer();
    void offerFromPeer();
    void offerFromWire();

    ModuleConformance::Factory const& m_makeDriver;
    ConformanceLadder m_ladder;
    std::unique_ptr<Parts> m_parts;
    unsigned int m_legsBefore = 0;
    std::size_t m_seenBefore = 0; // in this call
};
