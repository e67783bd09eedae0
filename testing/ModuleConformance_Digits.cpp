// Cases of digits: during a call, and after the offer.
#include "testing/ConformanceCases.h"

using namespace ConformanceCases;

namespace
{
void DIGITS_REACH_THE_PEER(Situation& situation, Caller caller)
{
    situation.need(ModuleDriver::DIGITS_FROM_WIRE);
    situation.call(caller, Step::CONNECTED);
    for (char const digit : {'1', '9', '#'})
    {
        situation.did(Column::WIRE, std::string("> sends ") + digit);
        situation.driver().sendDigit(digit);
        situation.settle();
    }
    situation.await(
        Suite::PASSES_DIGITS, [&] { return situation.digitsHeard() == "19#"; },
        "of 19# the peer hears '" + situation.digitsHeard() + "'");
    situation.endAsUsual();
}

void DIGITS_REACH_THE_WIRE(Situation& situation, Caller caller)
{
    situation.need(ModuleDriver::DIGITS_TO_WIRE);
    situation.call(caller, Step::CONNECTED);
    for (char const* const digit : {"1", "9", "#"})
        situation.peer().key(digit);
    situation.settle();
    std::string heard;
    for (Seen const& seen : situation.driver().getSeen())
        if (seen.what == Seen::DIGITS)
            heard += seen.text;
    situation.expect(Suite::PASSES_DIGITS, heard == "19#", "of 19# the wire hears '" + heard + "'");
    situation.endAsUsual();
}

void LATE_DIGITS_COMPLETE_THE_NUMBER(Situation& situation, bool isOneByOne)
{
    situation.need(ModuleDriver::LATE_DIGITS);
    std::string const number(situation.driver().getNumber().view());
    auto const& none = CC_PropertyContainer::EMPTY();
    situation.did(Column::PEER, "> dials " + number.substr(0, 2));
    situation.expect(Suite::ANSWERS_EACH_OFFER,
                     situation.peer()
                         .dial(situation.driver().getProviderName(), number.substr(0, 2).c_str(), none, none, none)
                         .isOk(),
                     "an offer with the first digits of its number is refused");
    situation.settle();
    Suite::Rule const& rule = Suite::COMPLETES_NUMBERS;
    situation.expect(rule, situation.count(Seen::OFFERED) == 0, "the wire was offered half a number");
    std::size_t const step = isOneByOne ? 1 : number.size();
    for (std::size_t i = 2; i < number.size(); i += step)
    {
        situation.peer().key(number.substr(i, step).c_str());
        situation.settle();
    }
    situation.await(
        rule, [&] { return situation.count(Seen::OFFERED) != 0; },
        "the number is complete, and the wire is not offered it");
    situation.expect(rule, situation.find(Seen::OFFERED)->text == number,
                     "the wire was offered the number '" + situation.find(Seen::OFFERED)->text + "'");
    situation.endAsUsual();
}
} // namespace

void ConformanceCases::ADD_DIGITS(Cases& cases)
{
    ADD_BOTH(cases, Suite::PASSES_DIGITS, "ToThePeer", DIGITS_REACH_THE_PEER);
    ADD_BOTH(cases, Suite::PASSES_DIGITS, "ToTheWire", DIGITS_REACH_THE_WIRE);
    ADD_TO_WIRE(cases, Suite::COMPLETES_NUMBERS, "AllAtOnce",
                [](Situation& situation) { LATE_DIGITS_COMPLETE_THE_NUMBER(situation, false); });
    ADD_TO_WIRE(cases, Suite::COMPLETES_NUMBERS, "OneByOne",
                [](Situation& situation) { LATE_DIGITS_COMPLETE_THE_NUMBER(situation, true); });
}
