#include "testing/ModuleConformance.h"
#include "testing/ModuleConformanceTests.h"
#include "tests/support/FaultyModule.h"

#include <cstdlib>
#include <fstream>
#include <gmock/gmock.h>
#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>
#include <iterator>
#include <memory>
#include <set>
#include <string>

using Suite = ModuleConformance;

// a module that keeps the rules, through what module authors write
CALLCONTROL_MODULE_CONFORMANCE(ConformingModule, FaultyDriver);

namespace
{
struct Broken
{
    Fault fault;
    char const* name;
    Suite::Rule const* rule;
    char const* says;
};

Broken const FAULTS[] = {
    {Fault::IGNORES_OFFERS_WHEN_BUSY, "IgnoresOffersWhenBusy", &Suite::ANSWERS_EACH_OFFER,
     "neither accepted nor rejected"},
    {Fault::ANSWERS_OFFERS_TWICE, "AnswersOffersTwice", &Suite::ANSWERS_EACH_OFFER, "an offer was answered twice"},
    {Fault::OFFERS_HALF_THE_NUMBER, "OffersHalfTheNumber", &Suite::TELLS_THE_WIRE, "offered the number '4989'"},
    {Fault::DOES_NOT_RING_THE_WIRE, "DoesNotRingTheWire", &Suite::TELLS_THE_WIRE, "does not hear it ring"},
    {Fault::DIALS_HALF_THE_NUMBER, "DialsHalfTheNumber", &Suite::TELLS_THE_PEER, "the number dialled is '4930'"},
    {Fault::DOES_NOT_SAY_ALERTING, "DoesNotSayAlerting", &Suite::TELLS_THE_PEER, "was not told ALERTING"},
    {Fault::KEEPS_ITS_LEG, "KeepsItsLeg", &Suite::DROPS_ONCE, "the reference is not given up"},
    {Fault::WRITES_AFTER_RELEASED, "WritesAfterReleased", &Suite::WRITES_NOTHING_AFTER_THE_DROP,
     "after RELEASED it wrote Display"},
    {Fault::CLEARS_THE_WIRE_TWICE, "ClearsTheWireTwice", &Suite::CLEARS_THE_WIRE_ONCE, "cleared more than once"},
    {Fault::CLEARS_NO_WIRE_THAT_RINGS, "ClearsNoWireThatRings", &Suite::CLEARS_THE_WIRE_ONCE, "was not cleared"},
    {Fault::CLEARS_BACK, "ClearsBack", &Suite::CLEARS_THE_WIRE_ONCE, "had no reason to be"},
    {Fault::CHANGES_CAUSES_TO_THE_WIRE, "ChangesCausesToTheWire", &Suite::CARRIES_CAUSES,
     "cause 21 reaches the wire as 31"},
    {Fault::CHANGES_CAUSES_FROM_THE_WIRE, "ChangesCausesFromTheWire", &Suite::CARRIES_CAUSES,
     "cause 21 reaches the peer as 31"},
    {Fault::WAITS_FOR_ALERTING, "WaitsForAlerting", &Suite::FOLLOWS_ANY_ORDER, "not told of an answer"},
    {Fault::ENDS_WITH_A_NEW_PEER, "EndsWithANewPeer", &Suite::FOLLOWS_ANY_ORDER, "had no reason to be"},
    {Fault::ANSWERS_THE_WIRE_AGAIN, "AnswersTheWireAgain", &Suite::FOLLOWS_ANY_ORDER, "answer more than once"},
    {Fault::WAITS_FOR_RELEASED, "WaitsForReleased", &Suite::SURVIVES_A_LOST_PEER, "the wire was not cleared"},
    {Fault::WAITS_FOR_THE_WIRE, "WaitsForTheWire", &Suite::SURVIVES_A_SILENT_WIRE, "still not RELEASED"},
    {Fault::NEVER_GIVES_UP, "NeverGivesUp", &Suite::SURVIVES_A_SILENT_WIRE, "was not given up"},
    {Fault::DROPS_THE_FIRST_FOR_THE_SECOND, "DropsTheFirstForTheSecond", &Suite::KEEPS_CALLS_APART,
     "had no reason to be"},
    {Fault::LOSES_DIGITS_FROM_THE_WIRE, "LosesDigitsFromTheWire", &Suite::PASSES_DIGITS, "the peer hears ''"},
    {Fault::LOSES_DIGITS_TO_THE_WIRE, "LosesDigitsToTheWire", &Suite::PASSES_DIGITS, "the wire hears ''"},
    {Fault::LOSES_LATE_DIGITS, "LosesLateDigits", &Suite::COMPLETES_NUMBERS, "the wire is not offered it"},
    {Fault::OFFERS_BEFORE_ALL_DIGITS, "OffersBeforeAllDigits", &Suite::COMPLETES_NUMBERS, "offered half a number"},
    {Fault::STAYS_BROKEN_WITHOUT_MEMORY, "StaysBrokenWithoutMemory", &Suite::SURVIVES_NO_MEMORY, "in the next call"},
    {Fault::LEAVES_ITS_LEG_BEHIND, "LeavesItsLegBehind", &Suite::LEAVES_NOTHING, "the peer sees its leg CONNECTED"},
};

/// What the suite finds at a module with that fault: the rules that are broken, and all that it says.
struct Findings
{
    explicit Findings(Fault fault)
    {
        for (Suite::Case const& tried : Suite::CASES())
        {
            auto const outcome = Suite::RUN(tried, [fault] { return std::make_unique<FaultyDriver>(fault); });
            if (outcome.kind == Suite::Outcome::BROKEN)
                rules.insert(outcome.broken->name), text += outcome.text + "\n";
        }
    }

    std::set<std::string> rules;
    std::string text;
};

Suite::Case const& CASE(std::string const& name)
{
    for (Suite::Case const& tried : Suite::CASES())
        if (tried.name == name)
            return tried;
    ADD_FAILURE() << "no case " << name;
    return Suite::CASES().front();
}

class FaultyModuleTest : public testing::TestWithParam<Broken>
{
};
} // namespace

TEST_P(FaultyModuleTest, BreaksOneRuleAndIsToldWhich)
{
    Findings const found(GetParam().fault);
    EXPECT_EQ(found.rules, std::set<std::string>{GetParam().rule->name}) << found.text;
    EXPECT_THAT(found.text, testing::HasSubstr(std::string("rule ") + GetParam().rule->name + ": " +
                                               GetParam().rule->sentence + "\ncase "));
    EXPECT_THAT(found.text, testing::HasSubstr(GetParam().says));
}

INSTANTIATE_TEST_SUITE_P(Each, FaultyModuleTest, testing::ValuesIn(FAULTS),
                         [](auto const& each) { return each.param.name; });

TEST(ModuleConformance, FailsATestWithTheRuleAndTheLadder)
{
    auto const fail = []
    {
        ModuleConformanceTest(CASE("ClearsTheWireOnce_ThePeerClearsAfterTheAnswer_CallFromTheWire"),
                              [] { return std::make_unique<FaultyDriver>(Fault::CLEARS_THE_WIRE_TWICE); })
            .TestBody();
    };
    testing::TestPartResultArray failures;
    {
        testing::ScopedFakeTestPartResultReporter const reporter(
            testing::ScopedFakeTestPartResultReporter::INTERCEPT_ONLY_CURRENT_THREAD, &failures);
        fail();
    }
    ASSERT_EQ(failures.size(), 1);
    EXPECT_STREQ(
        failures.GetTestPartResult(0).message(),
        "Failed\n"
        "rule ClearsTheWireOnce: A call that ends at the other side is cleared on the wire, once, and the wire hears "
        "nothing of it afterwards; one that the wire has cleared itself is not.\n"
        "case ClearsTheWireOnce_ThePeerClearsAfterTheAnswer_CallFromTheWire: the wire was cleared more than once\n"
        "    the wire                          | the module's leg | the other side\n"
        "    > calls 4930123456                |                  |\n"
        "                                      | joins, CONNECTED |\n"
        "                                      |                  | peer/line joins, TRYING\n"
        "                                      |                  | peer/line ALERTING\n"
        "    ringing                           |                  |\n"
        "                                      |                  | peer/line CONNECTED\n"
        "    answered                          |                  |\n"
        "                                      |                  | > hangs up\n"
        "                                      |                  | peer/line cause 16\n"
        "                                      |                  | peer/line RELEASED\n"
        "    cleared 16 (Normal call clearing) |                  |\n"
        "    cleared 16 (Normal call clearing) |                  |\n"
        "                                      | cause 16         |\n"
        "                                      | RELEASED         |\n"
        "                                      | leaves the call  |\n"
        "                                      |                  | peer/line leaves the call\n");
}

TEST(ModuleConformance, SaysThatAModuleLetsAnExceptionOutBeforeItIsTooLate)
{
    auto const run = []
    {
        Suite::RUN(CASE("SurvivesNoMemory_EachAllocationUntilThePeerClears_CallFromTheWire"),
                   [] { return std::make_unique<FaultyDriver>(Fault::THROWS_WITHOUT_MEMORY); });
        std::exit(0); // a release build comes as far as this, a debug build's loop does not
    };
    EXPECT_EXIT(
        run(), [](int) { return true; }, "rule SurvivesNoMemory: .*\n.*an exception left the module");
}

TEST(ModuleConformance, SkipsWhatTheModuleCannotDoAndSaysWhy)
{
    struct Deaf : FaultyDriver
    {
        char const* whyNot(Ability ability) const override
        {
            return ability == DIGITS_FROM_WIRE ? "the wire has no keys" : nullptr;
        }
    };
    auto const outcome =
        Suite::RUN(CASE("PassesDigits_ToThePeer_CallToTheWire"), [] { return std::make_unique<Deaf>(); });
    EXPECT_EQ(outcome.kind, Suite::Outcome::SKIPPED);
    EXPECT_EQ(outcome.text, "the wire has no keys");
}

TEST(ModuleConformance, HasAFaultyModuleForEachRule)
{
    std::set<Suite::Rule const*> broken;
    for (Broken const& fault : FAULTS)
        broken.insert(fault.rule);
    EXPECT_EQ(broken, std::set<Suite::Rule const*>(Suite::RULES().begin(), Suite::RULES().end()));
}

TEST(ModuleConformance, HasItsRulesInTheGuide)
{
    std::ifstream file(GUIDE);
    std::string const guide(std::istreambuf_iterator<char>(file), {});
    for (Suite::Rule const* const rule : Suite::RULES())
        EXPECT_THAT(guide, testing::HasSubstr(std::string("| ") + rule->name + " | " + rule->sentence + " |\n"));
}

TEST(ModuleConformance, HasACaseForEachRuleAndNoTwoOfOneName)
{
    std::set<Suite::Rule const*> tried;
    std::set<std::string> names;
    for (Suite::Case const& each : Suite::CASES())
    {
        tried.insert(each.rule);
        EXPECT_TRUE(names.insert(each.name).second) << each.name;
    }
    EXPECT_EQ(tried, std::set<Suite::Rule const*>(Suite::RULES().begin(), Suite::RULES().end()));
}
