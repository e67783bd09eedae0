#include "diagnosis/CC_Explanation.h"

#include "testing/FailingAllocator.h"
#include "tests/support/ExplanationTest.h"

#include <array>
#include <map>
#include <random>

namespace
{
class CC_Explanation_Test : public ExplanationTest
{
protected:
    static std::string TREE(CC_Explanation const& explanation, unsigned int maxLevel = 9, unsigned int maxDetail = 9,
                            String const& prefix = String::s_empty)
    {
        InfoContainer info;
        return explanation.getInfo(info, maxLevel, 0, maxDetail, 0, prefix).getString_TreeFormat().c_str();
    }
    /// The numbers that differ from run to run, as letters.
    static std::string REPLACED(std::string text, std::map<std::string, std::string> const& replacements)
    {
        for (auto const& [from, to] : replacements)
            for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
                text.replace(at, from.size(), to);
        return text;
    }
    static std::string NUMBER(unsigned long long number) { return std::to_string(number); }
};
} // namespace

TEST_F(CC_Explanation_Test, ReadsAsATree)
{
    CC_Call& call = connect(anna, bert);
    m_clock.advance(1500);
    anna.hangUp();
    pass(42);
    std::string const tree = REPLACED(TREE(CC_Explanation::OF_CALL(call)),
                                      {{NUMBER(call.getSerial()) + " (" + call.getName().c_str(), "X (0x1"},
                                       {"call " + NUMBER(call.getSerial()), "call X"},

                                       {NUMBER(call.getCallLeg(0)->getSerial()) + " (anna", "A (anna"},
                                       {NUMBER(call.getCallLeg(1)->getSerial()) + " (bert", "B (bert"}});
    EXPECT_EQ(tree,
              "Call: X (0x1): INACTIVE for 42.000 s, made 43.500 s ago\n"
              "  End: leg bert/line is CONNECTED and held by adapter `line` of endpoint `bert`: it ends when that "
              "adapter drops\n"
              "  Call Leg: A (anna/line): RELEASED for 42.000 s, made 43.500 s ago\n"
              "    Held by: call X\n"
              "    Held by: adapter `line` of endpoint `bert` (peer)\n"
              "    Observed by: call X\n"
              "    Observed by: adapter `line` of endpoint `bert`\n"
              "  Call Leg: B (bert/line): CONNECTED for 43.500 s, made 43.500 s ago\n"
              "    Held by: call X\n"
              "    Held by: adapter `line` of endpoint `bert` (own)\n"
              "    Observed by: adapter `line` of endpoint `bert`\n"
              "    Observed by: call X\n"
              "  Observed by: adapter `line` of endpoint `bert`\n"
              "  Legs observed by: call X\n"
              "  Legs observed by: adapter `line` of endpoint `bert`\n");
}

TEST_F(CC_Explanation_Test, LeavesOutWhatIsTooDeepOrTooFine)
{
    CC_Call const& call = connect(anna, bert);
    CC_Explanation const explanation = CC_Explanation::OF_CALL(call);
    EXPECT_EQ(TREE(explanation, 0).find("End"), std::string::npos);
    EXPECT_EQ(TREE(explanation, 9, 0).find("bserved"), std::string::npos);
    EXPECT_NE(TREE(explanation, 9, 0).find("Held by"), std::string::npos);
    EXPECT_EQ(TREE(explanation, 9, 9, "Near End ").find("Near End Call: "), 0u);
}

TEST_F(CC_Explanation_Test, TheOrdinaryDumpsTellNothingOfIt)
{
    CC_Call const& call = connect(anna, bert);
    InfoContainer info;
    call.getInfo(info, 9, 0, 9, 0, String::s_empty);
    call.getCallLeg(0)->getInfo(info, 9, 0, 9, 0, String::s_empty);
    anna.adapter->getInfo(info, 9, 0, 9, 0, String::s_empty);
    std::string const dump = info.getString_TreeFormat().c_str();
    for (char const* const word : {"Held by", "End:", "Observed", "made "})
        EXPECT_EQ(dump.find(word), std::string::npos) << word;
}

TEST_F(CC_Explanation_Test, ReadsAsALineOfJsonForEachCallAndLeg)
{
    auto* const leg = new CC_CallLeg;
    ASSERT_TRUE(leg->setName("a \"b\"").isOk());
    m_clock.advance(2000);
    CC_Explanation const explanation = CC_Explanation::OF_LEGS_WITHOUT_CALL();
    ASSERT_EQ(explanation.getJson().size(), 1u);
    EXPECT_EQ(explanation.getJson()[0],
              "{\"leg\":" + NUMBER(leg->getSerial()) +
                  ",\"name\":\"a \\\"b\\\"\",\"state\":\"IDLE\",\"age\":2000000000,\"inState\":2000000000,"
                  "\"references\":1,\"holders\":[{\"kind\":\"nobody known\",\"references\":1}],\"observers\":[],"
                  "\"isMoving\":false,\"isBusy\":false,\"end\":\"leg a \\\"b\\\" is IDLE and driven by no adapter: it "
                  "ends when whoever holds the 1 reference that nobody is known for stores RELEASED and gives up\"}");
    leg->removeReference();
    CC_Call const& call = connect(anna, bert);
    std::string const line = CC_Explanation::OF_CALL(call).getJson().at(0);
    EXPECT_EQ(line.find("{\"call\":" + NUMBER(call.getSerial()) + ",\"name\":\""), 0u) << line;
    for (char const* const part :
         {"\"state\":\"ACTIVE\"", "\"hasPool\":true", "\"isCleanUpPending\":false", "\"holds\":0",
          "{\"kind\":\"own adapter\",\"references\":1,\"adapter\":\"line\",\"endpoint\":\"anna\",\"untold\":0}",
          "\"end\":\"leg anna/line is CONNECTED and held by adapter `line` of endpoint `anna`: it ends when that "})
        EXPECT_NE(line.find(part), std::string::npos) << part << "\n" << line;
}

TEST_F(CC_Explanation_Test, ANameSteersNoTerminal)
{
    auto* const leg = new CC_CallLeg;
    ASSERT_TRUE(leg->setName("\x1b[2J").isOk());
    std::string const tree = TREE(CC_Explanation::OF_LEGS_WITHOUT_CALL());
    EXPECT_EQ(tree.find('\x1b'), std::string::npos);
    EXPECT_NE(tree.find("(\\x1b[2J): IDLE for 0.000 s"), std::string::npos) << tree;
    leg->removeReference();
}

TEST_F(CC_Explanation_Test, CallsAreAskedForByAge)
{
    CC_Call const& older = connect(anna, bert);
    pass(10);
    Party dora("dora");
    ASSERT_EQ(carl.dial(dora), XCode::OK);
    pass(5);
    auto const serials = [](unsigned int seconds)
    {
        std::vector<unsigned long long> found;
        CC_Explanation const explanation = CC_Explanation::OF_CALLS_OLDER_THAN(seconds);
        for (CC_Explanation::Call const& call : explanation.getCalls())
            found.push_back(call.serial);
        return found;
    };
    EXPECT_EQ(serials(15), std::vector{older.getSerial()});
    EXPECT_EQ(serials(5), (std::vector{older.getSerial(), carl.getCall()->getSerial()}))
        << "in the order of their making";
    EXPECT_TRUE(serials(16).empty());
    EXPECT_TRUE(CC_Explanation::OF_CALL(0).getCalls().empty());
}

TEST_F(CC_Explanation_Test, WhatWasMadeWithoutALoopIsOfUnknownAge)
{
    CallControl::SET_CC_EVENT_LOOP(nullptr);
    auto* const leg = new CC_CallLeg;
    CallControl::SET_CC_EVENT_LOOP(&m_fixture.m_loop);
    EXPECT_FALSE(explainLeg().age.isKnown);
    EXPECT_NE(TREE(CC_Explanation::OF_LEGS_WITHOUT_CALL(99)).find("IDLE for an unknown time, made an unknown time ago"),
              std::string::npos);
    EXPECT_NE(CC_Explanation::OF_LEGS_WITHOUT_CALL().getJson().at(0).find("\"age\":null"), std::string::npos);
    leg->removeReference();
}

TEST_F(CC_Explanation_Test, WithoutMemoryTheDumpIsIncompleteAndTheExplanationAnException)
{
    CC_Call const& call = connect(anna, bert);
    CC_Explanation const explanation = CC_Explanation::OF_CALL(call);
    bool isOver = false;
    for (unsigned long n = 1; !isOver; ++n)
    {
        InfoContainer info;
        FailingAllocator::failNth(n);
        explanation.getInfo(info, 9, 0, 9, 0, String::s_empty);
        isOver = !FailingAllocator::hasFailed();
        FailingAllocator::stop();
        ASSERT_EQ(info.isIncomplete(), !isOver) << n;
    }
    isOver = false;
    for (unsigned long n = 1; !isOver; ++n)
    {
        bool hasThrown = false;
        FailingAllocator::failNth(n);
        try
        {
            std::ignore = CC_Explanation::OF_CALL(call).getCalls().size();
        }
        catch (std::bad_alloc const&)
        {
            hasThrown = true;
        }
        isOver = !FailingAllocator::hasFailed();
        FailingAllocator::stop();
        ASSERT_EQ(hasThrown, !isOver) << n;
    }
}

namespace
{
/// Lines that dial, answer, transfer and drop at random, and modules that take references and forget them.
struct RandomCalls
{
    static constexpr std::size_t PARTIES = 6;

    RandomCalls()
    {
        for (std::size_t i = 0; i < PARTIES; ++i)
            parties[i] = std::make_unique<Party>("p" + std::to_string(i));
    }
    ~RandomCalls()
    {
        for (auto const& [leg, number] : forgotten)
            for (int i = 0; i < number; ++i)
                leg->removeReference();
    }

    unsigned int draw(unsigned int below) { return static_cast<unsigned int>(random() % below); }
    Party& any() { return *parties[draw(PARTIES)]; }

    void step()
    {
        Party& party = any();
        switch (draw(6))
        {
        case 0:
            std::ignore = party.dial(any()); // refused when it is busy, or calls itself
            break;
        case 1:
            std::ignore = party.become(State::CONNECTED);
            break;
        case 2:
            party.hangUp();
            break;
        case 3:
            std::ignore = party.adapter->transfer(*any().adapter, draw(2) == 0);
            break;
        case 4:
            if (CC_Call* const call = party.getCall())
                take(*call->getCallLeg(draw(call->getNumberOfCallLegs())));
            break;
        default:
            giveBack();
            break;
        }
    }
    void take(CC_CallLeg& leg)
    {
        leg.addReference();
        ++forgotten[&leg];
    }
    void giveBack()
    {
        if (forgotten.empty())
            return;
        auto const first = forgotten.begin();
        CC_CallLeg* const leg = first->first;
        if (--first->second == 0)
            forgotten.erase(first);
        leg->removeReference();
    }

    /// What the truth is: who holds the leg, as texts, with the number of times.
    std::map<std::string, int> holdersOf(unsigned long long serial) const
    {
        std::map<std::string, int> holders;
        for (auto const& party : parties)
        {
            std::string const name = std::string("adapter `line` of endpoint `") + party->name.c_str() + "`";
            CC_CallLeg const* const own = party->adapter->getOwnCallLeg();
            CC_CallLeg const* const peer = party->adapter->getPeerCallLeg();
            if (own != nullptr && own->getSerial() == serial)
                ++holders[name + " (own)"];
            if (peer != nullptr && peer->getSerial() == serial)
                ++holders[name + " (peer)"];
        }
        for (auto const& [leg, number] : forgotten)
            if (leg->getSerial() == serial)
                holders["nobody known: " + std::to_string(number)] += number;
        return holders;
    }
    void check(CC_Explanation::Leg const& leg, unsigned long long call) const
    {
        std::map<std::string, int> expected = holdersOf(leg.serial);
        if (call != 0)
            ++expected["call " + std::to_string(call)];
        std::map<std::string, int> told;
        for (CC_Explanation::Holder holder : leg.holders)
        {
            holder.untold = 0;
            told[CC_Explanation::TEXT_OF(holder)] += holder.references;
        }
        ASSERT_EQ(told, expected) << leg.name;
        for (CC_Explanation::Observer const& observer : leg.observers)
            ASSERT_EQ(observer.surplus, 0) << CC_Explanation::TEXT_OF(observer);
    }
    void check() const
    {
        CC_Explanation const calls = CC_Explanation::OF_CALLS_OLDER_THAN(0);
        CC_Explanation const legs = CC_Explanation::OF_LEGS_WITHOUT_CALL();
        std::size_t number = legs.getLegs().size();
        for (CC_Explanation::Call const& call : calls.getCalls())
        {
            number += call.legs.size();
            for (CC_Explanation::Leg const& leg : call.legs)
                check(leg, call.serial);
            for (auto const* const observers : {&call.observers, &call.legObservers})
                for (CC_Explanation::Observer const& observer : *observers)
                    ASSERT_EQ(observer.surplus, 0) << CC_Explanation::TEXT_OF(observer);
        }
        for (CC_Explanation::Leg const& leg : legs.getLegs())
            check(leg, 0);
        EXPECT_EQ(calls.getCalls().size(), CC_Call::s_numberOfInstances);
        EXPECT_EQ(number, CC_CallLeg::s_numberOfInstances);
    }

    std::mt19937 random{7};
    std::array<std::unique_ptr<Party>, PARTIES> parties;
    std::map<CC_CallLeg*, int> forgotten;
};
} // namespace

TEST(CC_Explanation_Random_Test, PutsEveryReferenceDownToWhoHasIt)
{
    CallControlFixture fixture;
    {
        RandomCalls calls;
        for (int step = 0; step < 1000 && !testing::Test::HasFailure(); ++step)
        {
            calls.step();
            if (calls.draw(3) == 0)
                fixture.settle();
            calls.check();
        }
    }
    fixture.settle();
}
