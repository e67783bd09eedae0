#include "diagnosis/CC_RecordingReport.h"

#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "recorder/CC_Recorder.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/DrivenClock.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/PartyTest.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <string>

namespace
{
using Lines = CC_RecordingReport::Lines;
using Privacy = CC_RecordingReport::Privacy;

class PrefixNumbers : public CC_PropertyFilter
{
public:
    CC_PropertyFilter* clone() const override { return new PrefixNumbers(*this); }
    XCode apply(CC_PropertyContainer& properties) const override
    {
        auto const* const number = CC_PropertyString::FROM(properties.get(CC_PropertyId::E164_NUMBER));
        if (number == nullptr || number->getValue().view().starts_with("+"))
            return XCode::OK;
        return properties.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, "+" + number->getValue()));
    }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }
};

class CC_RecordingReport_Test : public PartyTest
{
protected:
    CC_RecordingReport_Test() { EXPECT_EQ(CC_Recorder::START(), XCode::OK); }
    ~CC_RecordingReport_Test() override { CC_Recorder::CLOSE(); }

    static CC_RecordingReport report(Privacy privacy = Privacy::MASKED)
    {
        return CC_RecordingReport(CC_Recording::READ(CC_Recorder::GET_IMAGE()), privacy);
    }
    static bool has(Lines const& lines, std::string const& text)
    {
        return std::any_of(lines.begin(), lines.end(),
                           [&](std::string const& line) { return line.find(text) != std::string::npos; });
    }
    static std::string all(Lines const& lines)
    {
        std::string text;
        for (std::string const& line : lines)
            text += line + '\n';
        return text;
    }
    CC_PropertyContainer number(char const* text, QPresentationIndicator indicator = QPresentationIndicator::ALLOWED)
    {
        CC_PropertyContainer own;
        EXPECT_EQ(own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, text)), XCode::OK);
        EXPECT_EQ(own.set(CC_PropertyPresentationIndicator(CC_PropertyId::PRESENTATION_INDICATOR, indicator)),
                  XCode::OK);
        return own;
    }

    DrivenClock clock;
};
} // namespace

TEST_F(CC_RecordingReport_Test, TheLadderShowsTheExchangeBetweenTheLegs)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert, number("4420791234")), XCode::OK);
    unsigned long long const call = anna.getCall()->getSerial();
    clock.advance(20);
    settle();
    ASSERT_EQ(bert.become(State::ALERTING), XCode::OK);
    settle();
    bert.hangUp(QCause::USER_BUSY);
    settle();
    anna.hangUp();
    settle();
    Lines const ladder = report().getLadder(call);
    std::string const text = all(ladder);
    std::size_t position = 0;
    for (char const* const step : {"leg made",
                                   "E164-Number: 4420791234",
                                   "call made",
                                   "Context: 0x",
                                   "[the pool]",
                                   "joins call",
                                   "dials bert 4989123",
                                   "offered to a RecordingEndpoint",
                                   "State: IDLE -> TRYING",
                                   "accepted: OK",
                                   "says OK",
                                   "dialled: OK",
                                   "<- told: ",
                                   "State: TRYING -> ALERTING",
                                   "<- told: State",
                                   "drops cause 17 ",
                                   "Cause: ",
                                   "State: ALERTING -> RELEASED",
                                   "clean-up: the call stays: a leg is live",
                                   "drops cause 16 ",
                                   "clean-up: the call ends: no leg is live",
                                   "call given back to its pool",
                                   "call ended"})
    {
        position = text.find(step, position);
        ASSERT_NE(position, std::string::npos) << "\"" << step << "\" is not there, or not in this order:\n" << text;
    }
    EXPECT_TRUE(has(ladder, "anna/line")) << text;
    EXPECT_TRUE(has(ladder, "bert/line")) << text;
}

TEST_F(CC_RecordingReport_Test, EachLegHasAColumnAndTimeBeginsWithTheCall)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    unsigned long long const call = anna.getCall()->getSerial();
    clock.advance(1234);
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    Lines const ladder = report().getLadder(call);
    ASSERT_GT(ladder.size(), 3u);
    std::size_t const first = ladder[1].find("leg ");
    std::size_t const second = ladder[1].find("leg ", first + 1);
    std::string const& last = ladder.back();
    EXPECT_EQ(last.find("1234.000"), 3u) << last;
    EXPECT_EQ(last.substr(first, 1), "|");
    EXPECT_EQ(last.substr(second), "| State: TRYING -> CONNECTED");
}

TEST_F(CC_RecordingReport_Test, ACallThatItDoesNotKnowHasNoLadder)
{
    EXPECT_TRUE(report().getLadder(987654321).empty());
}

TEST_F(CC_RecordingReport_Test, HistoryTellsEachValueItsWriterAndTheFilter)
{
    CC_PropertyFilterContainer filters;
    RecordingPropertyFilter const idle("idle");
    ASSERT_EQ(filters.addFilter(idle), XCode::OK);
    ASSERT_EQ(filters.addFilter(PrefixNumbers()), XCode::OK);
    Party anna("anna", "", nullptr, &filters);
    Party bert("bert");
    connect(anna, bert);
    ASSERT_EQ(anna.say(CC_PropertyId::E164_NUMBER, "4420791234"), XCode::OK);
    ASSERT_EQ(bert.adapter->setPeerProperty(CC_PropertyString(CC_PropertyId::NAME, "Ada")), XCode::OK);
    ASSERT_EQ(anna.say(CC_PropertyId::NAME, "Anna"), XCode::OK);
    CC_CallLeg* const leg = anna.getCall()->getCallLeg(0);
    ASSERT_EQ(leg->setProperty(CC_PropertyString(CC_PropertyId::NAME, "X")), XCode::OK);
    unsigned long long const ofAnna = leg->getSerial();
    std::string const ofBert = std::to_string(anna.getCall()->getCallLeg(1)->getSerial());

    Lines const numbers = report().getHistory(ofAnna, "E164-Number");
    ASSERT_EQ(numbers.size(), 1u);
    EXPECT_NE(numbers[0].find("  +4420791234  by filter 1 (anonymous namespace)::PrefixNumbers"), std::string::npos)
        << numbers[0];
    Lines const names = report().getHistory(ofAnna, "name");
    ASSERT_EQ(names.size(), 3u) << all(names);
    EXPECT_NE(names[0].find("  Ada  by the peer's adapter, leg " + ofBert + " bert/line"), std::string::npos)
        << names[0];
    EXPECT_NE(names[1].find("  Anna  by its own adapter"), std::string::npos) << names[1];
    EXPECT_NE(names[2].find("  X  by code outside any adapter"), std::string::npos) << names[2];
    EXPECT_TRUE(report().getHistory(ofAnna, "no such property").empty());

    Lines const asJson = report().getHistoryJson(ofAnna, "name");
    ASSERT_EQ(asJson.size(), 3u) << all(asJson);
    EXPECT_NE(asJson[2].find("\"before\":\"Anna\",\"after\":\"X\""), std::string::npos) << asJson[2];
}

TEST_F(CC_RecordingReport_Test, WhatTwoModulesWriteOneBehindTheOtherIsNotTakenForOnes)
{
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    ASSERT_EQ(carl.adapter->accept(*anna.getCall(), CC_PropertyContainer::EMPTY()), XCode::OK);
    settle();
    unsigned long long const ofAnna = anna.getCall()->getCallLeg(0)->getSerial();
    for (Party* const party : {&bert, &carl})
    {
        CC_PropertyContainer several;
        ASSERT_EQ(several.set(CC_PropertyString(CC_PropertyId::NAME, party->name)), XCode::OK);
        ASSERT_EQ(several.set(CC_PropertyString(CC_PropertyId::DISPLAY, party->name)), XCode::OK);
        ASSERT_EQ(party->adapter->setPeerProperties(several), XCode::OK);
    }
    for (char const* const property : {"name", "display"})
    {
        Lines const values = report().getHistory(ofAnna, property);
        ASSERT_EQ(values.size(), 2u) << all(values);
        EXPECT_NE(values[0].find(" bert/line"), std::string::npos) << values[0];
        EXPECT_NE(values[1].find(" carl/line"), std::string::npos) << values[1];
    }
}

TEST_F(CC_RecordingReport_Test, WhoeverWritesInsideANotificationIsNamedAndNotWhomItIsToldOf)
{
    Party anna("anna");
    Party bert("bert");
    connect(anna, bert);
    CC_CallLeg* const ofAnna = anna.getCall()->getCallLeg(0);
    class Meddler : public CC_CallLegObserver
    {
    public:
        void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override
        {
            CC_PropertyString const display(CC_PropertyId::DISPLAY, "x");
            if (!std::exchange(m_isDone, true))
                std::ignore = event.getSource()->setProperty(display); // its history tells
        }
        void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override {}
        void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
        void onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) override {}

    private:
        bool m_isDone = false;
    } meddler;
    ASSERT_EQ(ofAnna->addCallLegObserver(&meddler), XCode::OK);
    ASSERT_EQ(anna.say(CC_PropertyId::NAME, "Ada"), XCode::OK);
    ofAnna->removeCallLegObserver(&meddler);
    Lines const displays = report().getHistory(ofAnna->getSerial(), "display");
    ASSERT_EQ(displays.size(), 1u);
    EXPECT_NE(displays[0].find("by code outside any adapter"), std::string::npos) << displays[0];
}

TEST_F(CC_RecordingReport_Test, NumbersThatMayNotBePresentedAreWithheldUnlessAskedFor)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert, number("4420791234", QPresentationIndicator::RESTRICTED)), XCode::OK);
    unsigned long long const leg = anna.getCall()->getCallLeg(0)->getSerial();
    for (Lines const& lines :
         {report().getLadders(), report().getHistory(leg, "e164"), report().getCalls(), report().getJson()})
    {
        EXPECT_FALSE(has(lines, "4420791234")) << all(lines);
        EXPECT_TRUE(has(lines, "(withheld)")) << all(lines);
    }
    EXPECT_TRUE(has(report(Privacy::WHOLE).getHistory(leg, "e164"), "4420791234"));
    EXPECT_TRUE(has(report(Privacy::WHOLE).getJson(), "4420791234"));
}

TEST_F(CC_RecordingReport_Test, NumbersAreWithheldWhenTheBeginningThatToldOfThemIsLost)
{
    CC_Recorder::CLOSE();
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(CC_Recorder::START(), XCode::OK);
    ASSERT_EQ(leg->setProperty(CC_PropertyString(CC_PropertyId::E164_NUMBER, "4420791234")), XCode::OK);
    EXPECT_FALSE(has(report().getJson(), "4420791234"));
    using Indicator = CC_PropertyPresentationIndicator;
    ASSERT_EQ(leg->setProperty(Indicator(CC_PropertyId::PRESENTATION_INDICATOR, QPresentationIndicator::ALLOWED)),
              XCode::OK);
    EXPECT_TRUE(has(report().getJson(), "4420791234"));
    leg->removeReference();
}

TEST_F(CC_RecordingReport_Test, CallsAreOneLineEach)
{
    Party anna("anna");
    Party bert("bert");
    ASSERT_EQ(anna.dial(bert, number("4420791234")), XCode::OK);
    std::string const serial = std::to_string(anna.getCall()->getSerial());
    ASSERT_EQ(bert.say(CC_PropertyId::E164_NUMBER, "4989123"), XCode::OK);
    clock.advance(61000);
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    Lines const up = report().getCalls();
    ASSERT_EQ(up.size(), 2u);
    EXPECT_NE(up[1].find(serial + "  up                       61.000 s  4420791234 - 4989123"), std::string::npos)
        << up[1];
    EXPECT_EQ(all(report().getCallsJson()), "{\"call\":" + serial +
                                                ",\"state\":\"up\",\"hasBeginning\":true,\"age\":61000000000,"
                                                "\"numbers\":[\"4420791234\",\"4989123\"]}\n");
    bert.hangUp(QCause::USER_BUSY);
    settle();
    anna.hangUp();
    settle();
    Lines const ended = report().getCalls();
    EXPECT_NE(ended[1].find("ended"), std::string::npos) << ended[1];
    EXPECT_NE(ended[1].find("User busy"), std::string::npos) << "the first cause tells why: " << ended[1];
    EXPECT_NE(all(report().getCallsJson()).find("\"state\":\"ended\""), std::string::npos);
    EXPECT_NE(all(report().getCallsJson()).find("\"cause\":\"User busy\"}"), std::string::npos);
}

TEST_F(CC_RecordingReport_Test, ServicesAndTransfersAreInTheLadder)
{
    Party anna("anna");
    Party bert("bert");
    Party carl("carl");
    Party second("anna2");
    connect(anna, bert);
    connect(second, carl);
    unsigned long long const call = anna.getCall()->getSerial();
    unsigned long long const other = second.getCall()->getSerial();
    CC_ServiceUserInput digit("5");
    bert.adapter->invokeSynchronousService(digit);
    ASSERT_EQ(anna.adapter->transfer(*second.adapter, true), XCode::OK);
    Lines const ladder = report().getLadder(call);
    EXPECT_TRUE(has(ladder, "asks CC_ServiceUserInput")) << all(ladder);
    EXPECT_TRUE(has(ladder, "<- CC_ServiceUserInput from leg")) << all(ladder);
    EXPECT_TRUE(has(ladder, "leaves call " + std::to_string(call))) << all(ladder);
    EXPECT_TRUE(has(ladder, "has moved from call " + std::to_string(other) + " to call " + std::to_string(call)));
    EXPECT_TRUE(has(report().getJson(), "transfer of the other legs of call " + std::to_string(other)));
}

TEST_F(CC_RecordingReport_Test, WhyAnOperationFailedIsRecorded)
{
    Party anna("anna");
    Party bert("bert");
    bert.endpoint.m_handleOffer = [](CC_Call&, String const&, CC_PropertyContainer const&) { return XCode::REFUSED; };
    EXPECT_EQ(anna.dial(bert), XCode::FAILURE);
    settle();
    Lines const all = report().getJson();
    EXPECT_TRUE(has(all, "Dial failed: the provider refuses"));
    EXPECT_TRUE(has(all, "says REFUSED"));
    EXPECT_TRUE(has(all, "dialled: FAILURE"));
}

TEST_F(CC_RecordingReport_Test, NothingInATextSteersATerminal)
{
    Party anna("anna");
    Party bert("bert");
    connect(anna, bert);
    ASSERT_EQ(anna.say(CC_PropertyId::DISPLAY, "\x1b[2J\n7"), XCode::OK);
    EXPECT_TRUE(has(report().getLadders(), "Display: \\x1b[2J\\x0a7"));
    for (Lines const& lines : {report().getLadders(), report().getJson()})
        EXPECT_FALSE(has(lines, "\x1b"));
}

TEST_F(CC_RecordingReport_Test, TheLinesStandInADumpAsTheyAre)
{
    InfoContainer info;
    EXPECT_EQ(&CC_RecordingReport::ADD(info, 1, {"a", "b"}), &info);
    EXPECT_STREQ(info.getString_TreeFormat().c_str(), "  a\n  b\n");
}
