#include "testing/ModuleConformance.h"

#include "testing/ConformanceCases.h"
#include "testing/ConformanceSituation.h"
#include "testing/FailingAllocator.h"
#include "testing/LeakCheck.h"

#include <cstdio>
#include <exception>

using Outcome = ModuleConformance::Outcome;
using Rule = ModuleConformance::Rule;

Rule const ModuleConformance::ANSWERS_EACH_OFFER{
    "AnswersEachOffer", "Each offer is either refused at once, or taken and then accepted or rejected, one of the two "
                        "and once, in the time that the driver gives."};
Rule const ModuleConformance::TELLS_THE_WIRE{
    "TellsTheWire", "What the peer does the wire is told, once: the number, that it rings, that it has answered."};
Rule const ModuleConformance::TELLS_THE_PEER{
    "TellsThePeer", "What the wire does is on the module's leg: the number dialled, ALERTING, CONNECTED."};
Rule const ModuleConformance::DROPS_ONCE{
    "DropsOnce", "A leg is dropped once: it becomes RELEASED, and its reference is given up, so that leg and call are "
                 "gone when everybody has hung up."};
Rule const ModuleConformance::WRITES_NOTHING_AFTER_THE_DROP{
    "WritesNothingAfterTheDrop",
    "Nothing is written to a leg once it is RELEASED: whoever reads why it ended does so then."};
Rule const ModuleConformance::CLEARS_THE_WIRE_ONCE{
    "ClearsTheWireOnce", "A call that ends at the other side is cleared on the wire, once, and the wire hears nothing "
                         "of it afterwards; one that the wire has cleared itself is not."};
Rule const ModuleConformance::CARRIES_CAUSES{"CarriesCauses",
                                             "A cause of Q.850 reaches the other side as it was given, both ways."};
Rule const ModuleConformance::FOLLOWS_ANY_ORDER{
    "FollowsAnyOrder", "The module follows the peer in whatever order and combination it is told: states that are "
                       "skipped, repeated or several in one turn, properties before states, another peer."};
Rule const ModuleConformance::SURVIVES_A_LOST_PEER{
    "SurvivesALostPeer", "A peer that vanishes without a word ends the call as one that hangs up does: an absent State "
                         "counts as RELEASED once there was a peer."};
Rule const ModuleConformance::SURVIVES_A_SILENT_WIRE{
    "SurvivesASilentWire", "A wire that says nothing any more keeps no leg: the leg is dropped without waiting for the "
                           "wire, and a call that the wire does not answer is given up in time."};
Rule const ModuleConformance::KEEPS_CALLS_APART{
    "KeepsCallsApart", "A second call leaves the first one alone, whether it is taken or not."};
Rule const ModuleConformance::PASSES_DIGITS{
    "PassesDigits", "A digit that is keyed in during a call reaches the other side, as user input, both ways."};
Rule const ModuleConformance::COMPLETES_NUMBERS{
    "CompletesNumbers", "Digits that come after the offer complete its number before the wire is called."};
Rule const ModuleConformance::SURVIVES_NO_MEMORY{
    "SurvivesNoMemory", "Whichever allocation of a call fails, the module lets go of that call when both sides hang "
                        "up, lets no exception out, and carries the next call."};
Rule const ModuleConformance::LEAVES_NOTHING{
    "LeavesNothing", "A module that ends, in the middle of a call too, takes its legs out of their calls and leaves no "
                     "object of call control behind."};

std::vector<Rule const*> const& ModuleConformance::RULES()
{
    static std::vector<Rule const*> const s_rules = {&ANSWERS_EACH_OFFER,
                                                     &TELLS_THE_WIRE,
                                                     &TELLS_THE_PEER,
                                                     &DROPS_ONCE,
                                                     &WRITES_NOTHING_AFTER_THE_DROP,
                                                     &CLEARS_THE_WIRE_ONCE,
                                                     &CARRIES_CAUSES,
                                                     &FOLLOWS_ANY_ORDER,
                                                     &SURVIVES_A_LOST_PEER,
                                                     &SURVIVES_A_SILENT_WIRE,
                                                     &KEEPS_CALLS_APART,
                                                     &PASSES_DIGITS,
                                                     &COMPLETES_NUMBERS,
                                                     &SURVIVES_NO_MEMORY,
                                                     &LEAVES_NOTHING};
    return s_rules;
}

namespace
{
std::string TEXT_OF(ModuleConformance::Case const& tried, Rule const& rule, std::string const& what,
                    ConformanceLadder const& ladder)
{
    return std::string("rule ") + rule.name + ": " + rule.sentence + "\ncase " + tried.name + ": " + what + "\n" +
           ladder.getText();
}

Outcome PLAY(ModuleConformance::Case const& tried, ConformanceSituation& situation)
{
    try
    {
        tried.play(situation);
        return {};
    }
    catch (ConformanceFailure const& failure)
    {
        FailingAllocator::stop();
        return {Outcome::BROKEN, failure.rule, TEXT_OF(tried, *failure.rule, failure.what, situation.ladder())};
    }
    catch (ConformanceSkip const& skip)
    {
        return {Outcome::SKIPPED, nullptr, skip.why};
    }
    catch (std::exception const& error)
    {
        FailingAllocator::stop();
        Rule const& rule = ModuleConformance::SURVIVES_NO_MEMORY;
        std::string const text =
            TEXT_OF(tried, rule, std::string("an exception left the module: ") + error.what(), situation.ladder());
        std::fputs(text.c_str(), stderr);
        return {Outcome::BROKEN, &rule, text};
    }
}
} // namespace

Outcome ModuleConformance::RUN(Case const& tried, Factory const& makeDriver)
{
    LeakCheck const check;
    Outcome outcome;
    std::string ladder;
    {
        ConformanceSituation situation(makeDriver);
        outcome = PLAY(tried, situation);
    }
    if (std::string const leaked = check.compare(); outcome.kind == Outcome::KEPT && !leaked.empty())
        outcome = {Outcome::BROKEN, &LEAVES_NOTHING,
                   TEXT_OF(tried, LEAVES_NOTHING, "left behind: " + leaked, ConformanceLadder())};
    return outcome;
}

std::vector<ModuleConformance::Case> const& ModuleConformance::CASES()
{
    using namespace ConformanceCases;
    static auto const s_cases = []
    {
        Cases cases;
        for (auto* const addGroup : {ADD_OFFERS, ADD_ENDS, ADD_CAUSES, ADD_ORDERS, ADD_LOSSES, ADD_SILENCE,
                                     ADD_NEIGHBOURS, ADD_DIGITS, ADD_MEMORY})
            addGroup(cases);
        return cases;
    }();
    return s_cases;
}
