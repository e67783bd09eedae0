#include "testing/ConformanceCases.h"

#include <tuple>
#include <utility>

namespace ConformanceCases
{
namespace
{
constexpr Caller CALLERS[] = {Caller::WIRE, Caller::PEER};
constexpr Step STEPS[] = {Step::OFFERED, Step::RINGING, Step::CONNECTED};

std::string NAME(Caller caller) { return caller == Caller::WIRE ? "_CallFromTheWire" : "_CallToTheWire"; }

std::string NAME(Step step)
{
    return step == Step::OFFERED ? "BeforeItRings" : step == Step::RINGING ? "WhileItRings" : "AfterTheAnswer";
}

void ADD(Cases& cases, Suite::Rule const& rule, std::string const& name, std::function<void(Situation&)> play)
{
    cases.push_back({&rule, std::string(rule.name) + "_" + name, std::move(play)});
}
} // namespace

XCode DIAL_MODULE(Situation& situation, FakeModule& party)
{
    auto const& none = CC_PropertyContainer::EMPTY();
    return party.dial(situation.driver().getProviderName(), situation.driver().getNumber(), none, none, none);
}

void EXPECT_ONE_ANSWER(Situation& situation, std::size_t legsBefore)
{
    situation.await(
        Suite::ANSWERS_EACH_OFFER, [&] { return situation.watch().getModules().size() > legsBefore; },
        "an offer was taken, but neither accepted nor rejected");
    situation.settle();
    situation.expect(Suite::ANSWERS_EACH_OFFER, situation.watch().getModules().size() == legsBefore + 1,
                     "an offer was answered twice");
}

void CALL_WHO_HOLDS_IT(Situation& situation)
{
    situation.peer().holdOffers();
    situation.did(Column::WIRE, std::string("> calls ") + ModuleDriver::PEER_NUMBER);
    situation.driver().placeCall(ModuleDriver::PEER_NUMBER);
    situation.await(
        Suite::TELLS_THE_PEER, [&] { return situation.peer().isHolding(); }, "the call did not reach the peer");
    situation.settle();
}

void BECOME(Situation& situation, State::State state)
{
    std::ignore = situation.peer().become(state); // no memory fails here
}

void ADD_TO_WIRE(Cases& cases, Suite::Rule const& rule, std::string const& name, std::function<void(Situation&)> play)
{
    ADD(cases, rule, name,
        [play = std::move(play)](Situation& situation)
        {
            situation.need(Caller::PEER);
            play(situation);
        });
}

void ADD_FROM_WIRE(Cases& cases, Suite::Rule const& rule, std::string const& name, std::function<void(Situation&)> play)
{
    ADD(cases, rule, name,
        [play = std::move(play)](Situation& situation)
        {
            situation.need(Caller::WIRE);
            play(situation);
        });
}

void ADD_BOTH(Cases& cases, Suite::Rule const& rule, std::string const& name,
              std::function<void(Situation&, Caller)> const& play)
{
    for (Caller const caller : CALLERS)
        ADD(cases, rule, name + NAME(caller), [=](Situation& situation) { play(situation, caller); });
}

void ADD_ALL(Cases& cases, Suite::Rule const& rule, std::string const& name,
             std::function<void(Situation&, Caller, Step)> const& play)
{
    for (Step const step : STEPS)
        ADD_BOTH(cases, rule, name + NAME(step),
                 [=](Situation& situation, Caller caller) { play(situation, caller, step); });
}
} // namespace ConformanceCases
