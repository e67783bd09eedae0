#include "Line.h"

#include "RingRhythm.h"
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyKeys.h"
#include "testing/CallControlFixture.h"
#include "testing/DrivenClock.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeModule.h"

#include <gtest/gtest.h>
#include <memory>
#include <tuple>

using State = CC_PropertyCallLegState;

namespace
{
class FakeTelephone : public Telephone, public Recorder
{
public:
    using Recorder::Recorder;
    void ring(String const& number, String const& name, unsigned int rhythm) override
    {
        FailingAllocator::Pause const unseen;
        record(std::string("rings, ") + number.c_str() + " " + name.c_str() +
               (rhythm != 0 ? ", rhythm " + std::to_string(rhythm) : ""));
    }
    void hear(Tone tone) override { note("hears ", std::to_string(tone).c_str()); }
    void show(String const& text) override { note("shows ", text.c_str()); }
    void clear(QCause cause) override { note("cleared ", std::to_string(static_cast<int>(cause)).c_str()); }

private:
    void note(char const* what, char const* detail)
    {
        FailingAllocator::Pause const unseen; // what a fake needs is none of the line's memory
        record(std::string(what) + detail);
    }
};

char const* ROUTE(String const& number)
{
    return number.startsWith("498")   ? "bert"
           : number.startsWith("493") ? "dora"
           : number.startsWith("44")  ? "anna"
                                      : "carl";
}

struct LineTest : testing::Test, CallControlFixture
{
    LineTest()
    {
        EXPECT_EQ(anna.open(), XCode::OK);
        EXPECT_EQ(bert.open(), XCode::OK);
    }
    Lines happened()
    {
        settle();
        return journal.take();
    }

    DrivenClock clock;
    Journal journal;
    FakeTelephone annas{"anna", &journal};
    FakeTelephone berts{"bert", &journal};
    Line anna{"anna", "4420791234", annas, ROUTE};
    Line bert{"bert", "4989123", berts, ROUTE};
    FakeModule carl{"carl"};
};
} // namespace

TEST_F(LineTest, ACallIsRungAnsweredHeldAndEnded)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(happened(), (Lines{"bert: rings, 4420791234 anna", "anna: hears 6", "bert: hears 0"}));
    EXPECT_EQ(bert.answer(), XCode::OK);
    EXPECT_EQ(happened(), Lines{"anna: hears 0"});
    EXPECT_EQ(bert.hold(), XCode::OK);
    EXPECT_EQ(happened(), Lines{"anna: hears 25"});
    EXPECT_EQ(bert.retrieve(), XCode::OK);
    EXPECT_EQ(happened(), Lines{"anna: hears 0"});
    bert.hangUp();
    EXPECT_EQ(happened(), Lines{"anna: cleared 16"});
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 0u);
}

TEST_F(LineTest, ARestrictedCallerIsNotShown)
{
    anna.restrict(true);
    EXPECT_EQ(anna.call("4989123", true, 3), XCode::OK);
    EXPECT_EQ(happened().front(), "bert: rings,  , rhythm 3");
}

TEST_F(LineTest, DumpsShowTheRhythmByItsName)
{
    InfoContainer info;
    EXPECT_EQ(RING_RHYTHM.make(3u).getInfo(info, 1, 0, 1, 0, "").getString_TreeFormat(),
              "Ring-Rhythm: rhythm 3 (Ring-Rhythm)\n");
}

TEST_F(LineTest, ANumberMayComeDigitByDigit)
{
    EXPECT_EQ(anna.call("498", false), XCode::OK);
    EXPECT_EQ(happened(), Lines{"bert: hears 0"});
    anna.key("91");
    EXPECT_EQ(happened(), Lines());
    anna.key("23");
    EXPECT_EQ(happened(), (Lines{"bert: rings, 4420791234 anna", "anna: hears 6"}));
}

TEST_F(LineTest, ALineThatWantsTheNumberAtOnceIsDialledAgain)
{
    FakeTelephone doras("dora", &journal);
    Line dora("dora", "4930", doras, ROUTE, true);
    EXPECT_EQ(dora.open(), XCode::OK);
    EXPECT_EQ(anna.call("493", false), XCode::OK);
    happened();
    anna.key("0");
    EXPECT_EQ(happened(), (Lines{"dora: rings, 4420791234 anna", "anna: hears 6", "dora: hears 0"}));
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 1u);
}

TEST_F(LineTest, ACallThatNobodyAnswersEnds)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    happened();
    clock.advance(Line::RINGING_TIME - 1);
    EXPECT_EQ(happened(), Lines());
    clock.advance(1);
    EXPECT_EQ(happened(), (Lines{"bert: cleared 19", "anna: cleared 19"}));
}

TEST_F(LineTest, ACallThatIsAnsweredIsNotEndedByTheTimer)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(bert.answer(), XCode::OK);
    happened();
    clock.advance(Line::RINGING_TIME);
    EXPECT_EQ(happened(), Lines());
}

TEST_F(LineTest, AWrongNumberAndABusyLineSaySo)
{
    EXPECT_EQ(anna.call("4985"), XCode::OK);
    EXPECT_EQ(happened().back(), "anna: cleared 1");
    EXPECT_EQ(carl.dial("bert", "4989123", {}, {}, {}), XCode::OK);
    happened();
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(happened(), Lines{"anna: cleared 17"});
}

TEST_F(LineTest, TonesTextsAndChargesReachTheTelephone)
{
    EXPECT_EQ(anna.call("115"), XCode::OK);
    EXPECT_EQ(carl.say(Key::CALL_PROGRESS_TONE.make(MG_Tones::ECallProgressTone::QUEUE)), XCode::OK);
    EXPECT_EQ(carl.say(CC_PropertyId::DISPLAY, "two before you"), XCode::OK);
    CC_PropertyCharge::Charge charge;
    charge.select(charge.m_freeOfCharge);
    EXPECT_EQ(carl.say(Key::CHARGE.make(charge)), XCode::OK);
    EXPECT_EQ(happened(), (Lines{"anna: hears 35", "anna: shows two before you", "anna: shows Free"}));
}

TEST_F(LineTest, ACallIsTransferredAfterAConsultation)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(bert.answer(), XCode::OK);
    EXPECT_EQ(bert.consult("7"), XCode::OK);
    EXPECT_EQ(carl.become(State::CONNECTED), XCode::OK);
    EXPECT_EQ(happened().back(), "bert: hears 0");
    EXPECT_EQ(bert.transfer(), XCode::OK);
    settle();
    EXPECT_EQ(carl.getPeerValue(CC_PropertyId::NAME), "anna");
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 1u);
}

TEST_F(LineTest, ThreePartiesMeet)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(bert.answer(), XCode::OK);
    EXPECT_EQ(bert.consult("7"), XCode::OK);
    EXPECT_EQ(carl.become(State::CONNECTED), XCode::OK);
    settle();
    EXPECT_EQ(bert.confer(), XCode::OK);
    settle();
    EXPECT_EQ(carl.getCall()->getNumberOfCallLegs(), 3u);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 1u);
}

TEST_F(LineTest, ACallerIsSentElsewhere)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(bert.answer(), XCode::OK);
    happened();
    EXPECT_EQ(bert.transferTo("7"), XCode::OK);
    EXPECT_EQ(carl.become(State::CONNECTED), XCode::OK);
    EXPECT_EQ(happened(), Lines{"anna: hears 0"});
    EXPECT_EQ(carl.getPeerValue(CC_PropertyId::NAME), "anna");
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 1u);
    anna.hangUp();
    settle();
    EXPECT_EQ(carl.getPeerState(), "RELEASED");
}

TEST_F(LineTest, MemoryMayRunOutAtAnyMoment)
{
    for (unsigned long n = 1;; ++n)
    {
        FailingAllocator::failNth(n);
        std::ignore = anna.call("498", false, 3);
        anna.key("9123");
        settle();
        std::ignore = bert.answer();
        settle();
        FailingAllocator::stop();
        if (!FailingAllocator::hasFailed())
            break; // all were tried
        anna.hangUp();
        bert.hangUp();
        settle();
        ASSERT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 0u) << "allocation " << n;
    }
    EXPECT_EQ(journal.take().back(), "anna: hears 0") << "in the end the call is up";
}

TEST_F(LineTest, ACallThatTheOperatorDropsIsCleared)
{
    EXPECT_EQ(anna.call("4989123"), XCode::OK);
    EXPECT_EQ(bert.answer(), XCode::OK);
    happened();
    getPool()->dropCalls("", "");
    EXPECT_EQ(happened(), (Lines{"bert: cleared 16", "anna: cleared 16"}));
    EXPECT_EQ(anna.call("4989123"), XCode::OK) << "both are idle again";
}

TEST_F(LineTest, ALineMayGoAwayInTheMiddleOfACall)
{
    auto dora = std::make_unique<Line>("dora", "4930", berts, ROUTE);
    EXPECT_EQ(dora->open(), XCode::OK);
    EXPECT_EQ(anna.call("4930"), XCode::OK);
    dora.reset();
    EXPECT_EQ(happened().back(), "anna: cleared 0") << "it ends without a cause";
    EXPECT_EQ(anna.call("4930"), XCode::FAILURE);
}
