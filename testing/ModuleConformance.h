#pragma once

#include "testing/ModuleDriver.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

class ConformanceSituation;

/// The rules that a signalling module has to keep, and cases that try each of them through a ModuleDriver: a call comes
/// from the wire or from a scripted party behind call control, rings, is answered, cleared, lost, and so on.
///
/// With GoogleTest, ModuleConformanceTests.h makes a test of each case. Without:
///
///     for (ModuleConformance::Case const& tried : ModuleConformance::CASES())
///         if (auto const outcome = ModuleConformance::RUN(tried, [] { return std::make_unique<LineDriver>(); });
///             outcome.kind == ModuleConformance::Outcome::BROKEN)
///             std::puts(outcome.text.c_str());
///
/// What is broken is told by the rule, in a sentence, with the ladder of what happened on the wire, at the module's leg
/// and at the other side:
///
///     rule DropsOnce: A leg is dropped once: ...
///     case DropsOnce_ThePeerClearsAfterTheAnswer_CallFromTheWire: its leg is RELEASED, but the reference is not given
///     up
///         the wire            | the module's leg        | the other side
///         ...
///
/// A case sets up call control for itself (CallControlFixture), so nobody else may have done so.
class ModuleConformance
{
public:
    /// What a module has to keep.
    struct Rule
    {
        char const* name;     ///< as filters of tests take it
        char const* sentence; ///< what the module has to do
    };
    /// The rules, each told by its sentence.
    /// @{
    static Rule const ANSWERS_EACH_OFFER;
    static Rule const TELLS_THE_WIRE;
    static Rule const TELLS_THE_PEER;
    static Rule const DROPS_ONCE;
    static Rule const WRITES_NOTHING_AFTER_THE_DROP;
    static Rule const CLEARS_THE_WIRE_ONCE;
    static Rule const CARRIES_CAUSES;
    static Rule const FOLLOWS_ANY_ORDER;
    static Rule const SURVIVES_A_LOST_PEER;
    static Rule const SURVIVES_A_SILENT_WIRE;
    static Rule const KEEPS_CALLS_APART;
    static Rule const PASSES_DIGITS;
    static Rule const COMPLETES_NUMBERS;
    static Rule const SURVIVES_NO_MEMORY;
    static Rule const LEAVES_NOTHING;
    /// @}
    /// All of them.
    static std::vector<Rule const*> const& RULES();

    /// Makes a driver, with the module in it.
    using Factory = std::function<std::unique_ptr<ModuleDriver>()>;

    /// One way to try a rule.
    struct Case
    {
        Rule const* rule;                                ///< that it tries first of all
        std::string name;                                ///< "DropsOnce_ThePeerClearsAfterTheAnswer_CallFromTheWire"
        std::function<void(ConformanceSituation&)> play; ///< what happens in it
    };
    /// All of them.
    static std::vector<Case> const& CASES();

    /// What came of a case.
    struct Outcome
    {
        /// How it ended.
        enum Kind
        {
            KEPT,
            SKIPPED, ///< the driver says that the module cannot do it; `text` says why
            BROKEN   ///< `text` says all
        };
        Kind kind = KEPT; ///< how it ended
        /// What was broken, which need not be the rule that the case is about: a call that does not even come up breaks
        /// a rule of its own. Null unless BROKEN.
        Rule const* broken = nullptr;
        std::string text{}; ///< of what is not KEPT: why
    };
    /// Plays the case with a driver of its own. An exception that leaves the module on its way through a loop breaks
    /// SURVIVES_NO_MEMORY. It is told on the standard error stream, too, since a loop that was left like this may end
    /// the program afterwards.
    static Outcome RUN(Case const& tried, Factory const& makeDriver);
};
